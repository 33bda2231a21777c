// The one way in which a report reaches the screen or the printer.
#pragma once

#include "platform/desktop/Form.h"
#include "platform/print/Report.h"

#include <QVariant>

class QPushButton;

namespace kest::db {
class Recordset;
}

namespace kest::report {
class Preview;
}

namespace kest {

class frmPrintPreview final : public desktop::Form {
    Q_OBJECT
public:
    /// Shows a report and returns when the user has closed it. `pvValue` is the value of all its parameters; for 720 a
    /// list of two: the shop and the title. Without a table the report shows what is saved in its template.
    /// A number without a report gives a box; any failure ends it in silence.
    static void ShowForm(qint32 peReportType, const QVariant& pvValue, db::Recordset* table);

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    explicit frmPrintPreview(const report::Report& report);

    void crvPreview_PrintButtonClicked();

    report::Preview* crvPreview;
    QPushButton* cmdExit;
};

}  // namespace kest

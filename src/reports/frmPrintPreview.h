// The window that shows and prints reports.
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

/// The report preview. Every report is shown and printed through this window.
class frmPrintPreview final : public desktop::Form {
    Q_OBJECT
public:
    /// Shows a report and returns when the user has closed it. `pvValue` is the value of all its parameters; for report
    /// 720 it is a list of the shop and the title. Without a table, the report shows the rows saved in its template.
    /// If the table has no row, the tags outside of rows show the first row of `outside`.
    /// Shows a box if there is no report with that number. Ignores every other error.
    static void ShowForm(qint32 peReportType, const QVariant& pvValue, db::Recordset* table,
                         const report::Table& outside = {});

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    explicit frmPrintPreview(const report::Report& report);

    void crvPreview_PrintButtonClicked();

    report::Preview* crvPreview;
    QPushButton* cmdExit;
};

}  // namespace kest

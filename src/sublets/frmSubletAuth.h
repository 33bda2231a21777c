// Lists and opens the documents that authorise the sublet work of a quote.
#pragma once

#include "platform/desktop/Form.h"
#include "sublets/SubletDocuments.h"

class QPushButton;
class QTreeWidget;

namespace kest {

/// The window "Sublet Authority Documents".
class frmSubletAuth final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the documents of the quote. If there are none, no window appears. Never throws.
    static void ShowForm(const QString& QTNNO, const QString& Subquote);

private:
    explicit frmSubletAuth(const QList<SubletDocument>& documents);

    void Command1_Click();  // Open
    void Command2_Click();  // Close

    QString folder;
    QTreeWidget* ListView1;
    QPushButton* Command1;
    QPushButton* Command2;
};

}  // namespace kest

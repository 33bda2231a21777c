// Lists the documents that authorise the sublet work of one quote, and opens them.
#pragma once

#include "sublets/SubletDocuments.h"
#include "platform/desktop/Form.h"

class QPushButton;
class QTreeWidget;

namespace kest {

class frmSubletAuth final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the quote's documents; without any there is no window. Never fails.
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

// The window that tells what changed a quote, from what to what.
#pragma once

#include "base/History.h"
#include "platform/desktop/Form.h"

#include <map>

class QLineEdit;
class QPushButton;
class QTreeWidget;

namespace kest::desktop {
class StatusLine;
}

namespace kest {

/// Lists the operations on a quote and its supplementary quotes, newest first, and the changes of the chosen one. A
/// search shows only the operations that have its text, also in one of their changes.
class frmHistory final : public desktop::Form {
    Q_OBJECT
public:
    /// Shows the history of a quote and returns when the user has closed the window.
    static void ShowForm(const QString& number);

private:
    explicit frmHistory(const QString& number);

    const QList<QStringList>& changesOf(qint64 operation);
    bool hasFoundText(qint64 operation);
    qint64 chosen() const;
    void arrange();
    void txtFind_Change();
    void ListView1_ItemClick();
    void tellCount(int visible);

    QString sQTNNO;
    std::map<qint64, QList<QStringList>> changes;  // rows of the lower list that were read so far, by operation

    QTreeWidget* ListView1;  // operations
    QTreeWidget* ListView2;  // changes
    QLineEdit* txtFind;
    desktop::StatusLine* lblStatus;
    QPushButton* cmdClose;
};

}  // namespace kest

// The window that shows what changed a quote, from what to what.
#pragma once

#include "base/History.h"
#include "platform/desktop/Form.h"

#include <functional>
#include <map>

class QLineEdit;
class QPushButton;
class QTreeWidget;

namespace kest::desktop {
class StatusLine;
}

namespace kest {

/// Lists the operations on a quote and its supplementary quotes, newest first, and the changes of the chosen one. A
/// search shows only the operations that have its text, also in one of their changes. "Undo" undoes the chosen load.
class frmHistory final : public desktop::Form {
    Q_OBJECT
public:
    /// Asks the user, undoes an operation, and returns true if it was undone.
    using Undo = std::function<bool(qint64 operation)>;

    /// Shows the history of a quote until the user closes the window. Without `undo` there is no button "Undo". Returns
    /// true if an operation was undone.
    static bool ShowForm(const QString& number, const Undo& undo);

private:
    frmHistory(const QString& number, Undo undoLoad);

    const QList<QStringList>& changesOf(qint64 operation);
    bool hasFoundText(qint64 operation);
    qint64 chosen() const;
    void arrange();
    void fill();
    void txtFind_Change();
    void ListView1_ItemClick();
    void cmdUndo_Click();
    void tellCount(int visible);

    QString sQTNNO;
    Undo undo;
    bool isUndone = false;
    std::map<qint64, QList<QStringList>> changes;  // rows of the lower list that were read so far, by operation

    QTreeWidget* ListView1;  // operations
    QTreeWidget* ListView2;  // changes
    QLineEdit* txtFind;
    desktop::StatusLine* lblStatus;
    QPushButton* cmdUndo;
    QPushButton* cmdClose;
};

}  // namespace kest

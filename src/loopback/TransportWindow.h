// The window of the loopback transport.
#pragma once

#include "loopback/TransportRunner.h"
#include "platform/desktop/Form.h"

class QPushButton;
class QTreeWidget;
class QTreeWidgetItem;

namespace kest::desktop {
class StatusLine;
}

namespace kest::app {

/// Runs a transport and lists the files that it carries.
class TransportWindow final : public desktop::Form {
    Q_OBJECT
public:
    explicit TransportWindow(const TransportFolders& folders);

    /// Returns false if another transport is running on these folders.
    bool claim() { return runner.claim(); }
    /// Lets the window that is open for these folders come to the front. Returns false if there is none.
    static bool raiseOther(const TransportFolders& folders);
    /// Shows the window until the user closes it or the program receives SIGINT or SIGTERM.
    void run();

private:
    void tell(const Carry& carry);
    void addRow(const QStringList& cells);
    void comeIfCalled();

    TransportRunner runner;
    QString call;  // a file with which another start calls this window
    QFileSystemWatcher calls;
    QTreeWidget* carriedList;
    QList<QTreeWidgetItem*> arrived;  // its rows, the oldest first
    desktop::StatusLine* status;
    QPushButton* carryButton;
    QPushButton* closeButton;
    int carriedFiles = 0;
};

}  // namespace kest::app

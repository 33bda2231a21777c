// The window of the loopback transport.
#pragma once

#include "loopback/TransportRunner.h"
#include "platform/desktop/Form.h"

class QLabel;
class QPushButton;
class QTreeWidget;

namespace kest::app {

/// Runs a transport and lists the files that it carries.
class TransportWindow final : public desktop::Form {
    Q_OBJECT
public:
    explicit TransportWindow(const TransportFolders& folders);

    /// Returns false if another transport is running on these folders.
    bool claim() { return runner.claim(); }
    /// Shows the window until the user closes it or the program receives SIGINT or SIGTERM.
    void run();

private:
    void tell(const Carry& carry);
    void addRow(const QStringList& cells);

    TransportRunner runner;
    QTreeWidget* carriedList;
    QLabel* status;
    QPushButton* carryButton;
    QPushButton* closeButton;
    int files = 0;
};

}  // namespace kest::app

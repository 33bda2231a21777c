// The transport's window: what was carried, as it is carried.
#pragma once

#include "loopback/TransportRunner.h"
#include "platform/desktop/Form.h"

class QLabel;
class QPushButton;
class QTreeWidget;

namespace kest::app {

class TransportWindow final : public desktop::Form {
    Q_OBJECT
public:
    explicit TransportWindow(const TransportFolders& folders);

    /// False where another transport works on these folders.
    bool claim() { return runner.claim(); }
    /// Shows the window until it is closed, or the program is told to end.
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

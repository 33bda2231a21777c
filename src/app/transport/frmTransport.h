// The transport's window: what was carried, as it is carried.
#pragma once

#include "app/transport/TransportRunner.h"
#include "platform/desktop/Form.h"

class QLabel;
class QPushButton;
class QTreeWidget;

namespace kest::app {

class frmTransport final : public desktop::Form {
    Q_OBJECT
public:
    explicit frmTransport(const TransportFolders& folders);

    /// False where another transport works on these folders.
    bool claim() { return runner.claim(); }
    /// Shows the window until it is closed, or the program is told to end.
    void ShowForm();

private:
    void show(const Carry& carry);
    void addRow(const QStringList& cells);

    TransportRunner runner;
    QTreeWidget* lvCarried;
    QLabel* lblStatus;
    QPushButton* cmdCarry;
    QPushButton* cmdClose;
    int files = 0;
};

}  // namespace kest::app

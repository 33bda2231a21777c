// The panel "ORLA Partner Network", which offers the four things that a user can do with the network.
#pragma once

#include "platform/desktop/Form.h"

#include <array>

class QLabel;
class QPushButton;
class QRadioButton;

namespace kest {

/// The panel. It reads the host's quote from `grsQuote`, which must be open before the panel is shown.
class frmKEST final : public desktop::Form {
    Q_OBJECT
public:
    frmKEST();

protected:
    bool event(QEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;

private:
    void Form_Load();
    void Form_Activate();
    void Option1_Click(int index);
    void cmdOK_Click();

    void sendQuote();
    void startTransport();
    void openUtilities();

    std::array<QRadioButton*, 4> Option1;
    QLabel* lblQuote;
    QPushButton* cmdOK;
    QPushButton* cmdExit;
    qint16 iOption = 1;
};

}  // namespace kest

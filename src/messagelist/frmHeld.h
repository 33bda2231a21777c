// The window that lists the messages that the list holds back.
#pragma once

#include "messagelist/Summary.h"
#include "platform/desktop/Form.h"

class QPushButton;
class QTreeWidget;

namespace kest {

/// Lists messages of the unread folder that are held back, with what each waits for, and shows their texts.
class frmHeld final : public desktop::Form {
    Q_OBJECT
public:
    /// Shows the messages and returns when the user has closed the window.
    static void ShowForm(const QList<HeldMessage>& messages);

private:
    explicit frmHeld(const QList<HeldMessage>& messages);

    void cmdView_Click();

    QTreeWidget* ListView1;
    QPushButton* cmdView;
    QPushButton* cmdClose;
};

}  // namespace kest

// Asks for the password before the utilities open and before a message is overwritten.
#pragma once

#include "platform/desktop/Form.h"

#include <QDate>

class QLineEdit;
class QPushButton;

namespace kest {

/// Returns the password of a day: a whole number that changes at midnight.
qint64 dayPassword(const QDate& day);

/// The password dialog.
class frmLogin final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the dialog and sets `ok` to true if the user types the password of the day, and to false otherwise.
    static void ShowForm(bool& ok);

private:
    frmLogin();

    void txtPassword_Change();
    void cmdOK_Click();
    void cmdCancel_Click();

    QLineEdit* txtPassword;
    QPushButton* cmdOK;
    QPushButton* cmdCancel;
    bool passed = false;
};

}  // namespace kest

// The password question before the utilities and before a message is overwritten.
#pragma once

#include "platform/desktop/Form.h"

#include <QDate>

class QLineEdit;
class QPushButton;

namespace kest {

/// The password of a day: a whole number that changes at midnight.
qint64 dayPassword(const QDate& day);

class frmLogin final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows the question; `ok` is true on return only after the day's password was typed.
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

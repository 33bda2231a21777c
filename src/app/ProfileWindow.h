// Asks where the data of a new shop is to be.
#pragma once

#include "platform/desktop/Form.h"

class QLineEdit;

namespace kest::app {

/// The question of a start from the menu without a profile.
class ProfileWindow final : public desktop::Form {
    Q_OBJECT
public:
    /// Asks for a folder and the name of the shop, and creates the profile there. If it is another folder than that of
    /// the profile, the profile becomes a link to it. A folder that already has a profile is used as it is. Does
    /// nothing if the user cancels.
    static void ShowForm();

private:
    ProfileWindow();

    void cmdBrowse_Click();
    void cmdOK_Click();

    QLineEdit* txtFolder;
    QLineEdit* txtName;
};

}  // namespace kest::app

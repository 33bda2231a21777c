#include "app/ProfileWindow.h"

#include "platform/Prompt.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Window.h"
#include "platform/profile.h"
#include "setup/Profile.h"
#include "shell/component.h"

#include <QDir>
#include <QFileDialog>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QVBoxLayout>

namespace kest::app {

using namespace Qt::StringLiterals;

ProfileWindow::ProfileWindow() : Form(u"frmProfile"_s, u"New Shop"_s), txtFolder(new QLineEdit), txtName(new QLineEdit)
{
    auto* question = new QLabel(
        u"There is no shop on this computer yet. &Folder for its settings, messages, pictures "
        "and quote database:"_s);
    question->setWordWrap(true);
    question->setBuddy(txtFolder);
    txtFolder->setObjectName(u"txtFolder"_s);
    txtFolder->setText(QDir::toNativeSeparators(profile::root()));
    txtFolder->setMinimumWidth(desktop::pixels(7500));
    auto* nameQuestion = new QLabel(u"&Name of the shop, the author of its saved reports:"_s);
    nameQuestion->setBuddy(txtName);
    txtName->setObjectName(u"txtName"_s);
    auto* cmdBrowse = button(u"cmdBrowse"_s, u"&Browse..."_s, [this] { cmdBrowse_Click(); });
    auto* cmdOK = button(u"cmdOK"_s, u"C&reate"_s, [this] { cmdOK_Click(); });
    auto* cmdCancel = button(u"cmdCancel"_s, u"Cancel"_s, [this] { close(); });
    cmdOK->setDefault(true);

    auto* folder = new QHBoxLayout;
    folder->addWidget(txtFolder, 1);
    folder->addWidget(cmdBrowse);
    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(cmdOK);
    buttons->addWidget(cmdCancel);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(question);
    layout->addLayout(folder);
    layout->addWidget(nameQuestion);
    layout->addWidget(txtName);
    layout->addLayout(buttons);
    fixSize();
}

void ProfileWindow::ShowForm()
{
    ProfileWindow window;
    desktop::showModal(window);
}

void ProfileWindow::cmdBrowse_Click()
{
    QFileDialog dialog(this, u"Folder of the Shop"_s, txtFolder->text());
    dialog.setObjectName(u"FolderDialog"_s);
    dialog.setFileMode(QFileDialog::Directory);
    dialog.setOption(QFileDialog::ShowDirsOnly);
    desktop::showModal(dialog);
    if (dialog.result() == QDialog::Accepted && !dialog.selectedFiles().isEmpty())
        txtFolder->setText(QDir::toNativeSeparators(dialog.selectedFiles().first()));
}

void ProfileWindow::cmdOK_Click()
{
    try {
        const desktop::WaitPointer pointer(u"Creating the shop..."_s);
        placeProfile(QDir::fromNativeSeparators(txtFolder->text().trimmed()));
        initProfile(registerClass, Shop::New);
        nameShop(txtName->text().trimmed());
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"The shop can't be created in this folder: "_s + error.description(), desktop::Icon::Critical);
        txtFolder->setFocus();
        return;
    }
    close();
}

}  // namespace kest::app

#include "platform/desktop/SaveDialog.h"

#include "platform/Prompt.h"
#include "platform/desktop/Window.h"
#include "platform/profile.h"

#include <QFileDialog>
#include <QFileInfo>
#include <QRegularExpression>
#include <QSettings>
#include <QStandardPaths>

namespace kest::desktop {

using namespace Qt::StringLiterals;

QString askForPdf(QWidget* parent, const QString& name)
{
    static const QRegularExpression notInNames(u"[\\\\/:*?\"<>|]"_s);
    QSettings file(profile::root() + u"/windows.ini"_s, QSettings::IniFormat);
    QString folder = file.value(u"SaveDialog/folder"_s).toString();
    if (!QFileInfo(folder).isDir())
        folder = QStandardPaths::writableLocation(QStandardPaths::DocumentsLocation);

    QFileDialog dialog(parent, u"Save as PDF"_s, folder, u"PDF files (*.pdf)"_s);
    dialog.setObjectName(u"SaveDialog"_s);
    dialog.setAcceptMode(QFileDialog::AcceptSave);
    dialog.setDefaultSuffix(u"pdf"_s);
    dialog.selectFile(QString(name).replace(notInNames, u"-"_s) + u".pdf"_s);
    showModal(dialog);
    if (dialog.result() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
        return {};
    const QString path = dialog.selectedFiles().first();
    if (isPersonPresent())
        file.setValue(u"SaveDialog/folder"_s, QFileInfo(path).absolutePath());
    return path;
}

}  // namespace kest::desktop

// Shows a message file as indented text, and saves the edited text after the password was given.
#pragma once

#include "platform/desktop/Form.h"

#include <QTextDocument>

#include <array>

class QLineEdit;
class QPushButton;

namespace kest::desktop {
class StatusLine;
}

namespace kest {

class ExactTextEdit;

/// The text viewer of a message, with a find bar.
class frmViewXML final : public desktop::Form {
    Q_OBJECT

public:
    /// Shows a file of `gsCurFolder`. `file` is the name without the folder.
    static void ShowForm(const QString& file);

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void chooseColours() override;
    void closeEvent(QCloseEvent* event) override;

private:
    explicit frmViewXML(const QString& file);

    void fillFindBar();
    void Command1_Click();
    void Command2_Click();
    void findNext(QTextDocument::FindFlags direction);
    /// A message that could not be shown is not overwritten with an empty text.
    void enableSave();
    void showPosition();
    void colourVisibleTags();

    QString sFile;
    bool unchanged = true;  // since the text was loaded or saved
    bool isShown = false;
    std::array<int, 3> coloured{};  // first line, last line and revision of the text that is coloured

    ExactTextEdit* txtXML;
    QPushButton* Command1;
    QPushButton* Command2;
    QWidget* findBar;
    QLineEdit* txtFind;
    desktop::StatusLine* lblPosition;
};

}  // namespace kest

// The window in which a user works through the messages of the three folders.
#pragma once

#include "messagelist/Summary.h"
#include "platform/desktop/Form.h"

#include <array>

class QGroupBox;
class QLabel;
class QLineEdit;
class QProgressBar;
class QPushButton;
class QRadioButton;
class QTimer;
class QTreeView;

namespace kest {

class MessageListModel;

class frmMessageList final : public desktop::Form {
    Q_OBJECT
public:
    frmMessageList();

    /// Opens the window on the unread folder and returns when the user has closed it.
    static void ShowForm();

    // What the window does, for a caller that does not show it. Boxes and prompts come as they do for a user.

    /// The unread folder, filled.
    void open();
    /// A click on the option of a folder.
    void chooseFolder(int folder);
    /// A text typed as the filter, and "Update".
    void updateFilter(const QString& filter);
    /// "Load" on a file of the folder, listed or not, with the refreshes that follow, the delayed one included. False
    /// when the message was not taken. For a name that leaves the folder, and for a listed one whose button is
    /// disabled, nothing happens.
    bool loadFile(const QString& file);
    /// "Reprint" on a file of the folder, listed or not. False when its report was refused or failed. For a listed one
    /// whose button is disabled nothing happens.
    bool reprintFile(const QString& file);

    void RefreshList();

    /// The rows of the last fill, whatever is searched for, and what ended it before its end; empty after a whole fill.
    const QList<ListedMessage>& rows() const;
    const QString& failure() const { return fillFailure; }

protected:
    void showEvent(QShowEvent* event) override;
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dragLeaveEvent(QDragLeaveEvent* event) override;
    void dropEvent(QDropEvent* event) override;

private:
    void Option1_Click(int index);
    void ListView1_ItemClick(int row);
    void ListView1_DblClick();
    void cmdProcess_Click();
    void cmdView_Click();
    bool cmdPrint_Click();
    void Command1_Click();
    void Command6_Click();
    void tmrRefresh_Timer();
    void txtFind_Change();
    void Form_KeyRefresh();
    void Form_Paste();

    void buildControls();
    void arrange();
    void connectControls();
    void fill();
    QString status() const;
    bool load(const QString& file);
    void takeIn(const QList<QUrl>& brought);
    bool hasSelection() const;
    QString selectedFile() const;
    void choose(int row);
    bool select(const QString& file);

    std::array<QRadioButton*, 3> Option1;
    QGroupBox* Frame1;
    QGroupBox* Frame2;
    QLabel* Label1;
    QLineEdit* txtFilter;
    QPushButton* Command1;
    QLineEdit* txtFind;
    QTreeView* ListView1;
    MessageListModel* messages;
    QLabel* lblStatus;
    QProgressBar* prgFill;
    QPushButton* cmdProcess;
    QPushButton* cmdView;
    QPushButton* cmdPrint;
    QPushButton* Command6;
    QPushButton* cmdExit;
    QTimer* tmrRefresh;

    QString sCurFile;  // last clicked in the list
    int iFolder = Unread;
    QString fillFailure;
    int busy = 0;  // fills and loads on the way; a delayed refresh waits for their end
};

}  // namespace kest

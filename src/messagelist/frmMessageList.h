// The window that lists the messages of the three folders.
#pragma once

#include "messagelist/MessageListControls.h"
#include "messagelist/Summary.h"
#include "platform/database/Connection.h"
#include "platform/desktop/Form.h"

#include <optional>

namespace kest {

/// Lists the unread, read or sent messages, and loads, reprints, shows or deletes the selected one.
class frmMessageList final : public desktop::Form, private MessageListControls {
    Q_OBJECT
public:
    frmMessageList();

    /// Opens the window on the unread folder and returns when the user has closed it.
    static void ShowForm();

    // The actions of the window, for callers that don't show it. Boxes and prompts appear as they do for a user.

    /// Fills the list from the unread folder.
    void openUnread();
    /// Acts as a click on the option of a folder.
    void chooseFolder(MessageFolder folder);
    /// Acts as typing the filter and clicking "Update".
    void updateFilter(const QString& filter);
    /// Acts as "Load" on a file of the folder, even if the list does not show it, and waits for the refreshes that
    /// follow, the delayed one included. Returns false if the message was not loaded. Does nothing and returns false
    /// for a name with a path, or if the list shows the file and "Load" is disabled for it.
    bool loadFile(const QString& file);
    /// Acts as "Reprint" on a file of the folder, even if the list does not show it. Returns false if the report was
    /// refused or failed. Does nothing and returns false if the list shows the file and "Reprint" is disabled for it.
    bool reprintFile(const QString& file);

    /// Fills the list again from the current folder.
    void RefreshList();

    /// Returns all rows of the last fill, even those that the search hides.
    const QList<ListedMessage>& rows() const;
    /// Returns why the last fill ended early or values are missing, or an empty text if it is complete.
    const QString& failure() const { return fillFailure; }
    /// Returns the messages that the last fill of the unread folder held back.
    const QList<HeldMessage>& heldMessages() const { return heldBack; }

protected:
    void showEvent(QShowEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dragLeaveEvent(QDragLeaveEvent* event) override;
    void dropEvent(QDropEvent* event) override;

private:
    void Option1_Click(MessageFolder folder);
    void ListView1_ItemClick(int row);
    void ListView1_DblClick();
    void cmdProcess_Click();
    void cmdView_Click();
    bool cmdPrint_Click();
    void Command1_Click();
    void Command6_Click();
    void cmdHeld_Click();
    void tmrRefresh_Timer();
    void txtFind_Change();
    void Form_KeyRefresh();
    void Form_Paste();

    void connectControls();
    void refill();
    void fill();
    QString status() const;
    void tell(const QString& text);
    void tellStatus();
    bool load(const QString& file);
    bool loadOnce(const QString& file, std::optional<db::Lock>& alone);
    void takeIn(const QList<QUrl>& brought);
    bool hasSelection() const;
    QString selectedFile() const;
    void choose(int row);
    bool select(const QString& file);

    QString sCurFile;  // the file clicked last
    MessageFolder iFolder = MessageFolder::Unread;
    QString fillFailure;
    QStringList settled;     // since the user's last action, a sentence for each interrupted operation
    bool isStopped = false;  // the last fill was stopped by Esc
    QList<HeldMessage> heldBack;
    int busy = 0;  // how many fills and loads are running; a delayed refresh waits until they end
};

}  // namespace kest

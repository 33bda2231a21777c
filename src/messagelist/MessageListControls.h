// The controls of the list window and their layout.
#pragma once

#include "messages/Folders.h"

#include <QList>

#include <array>

class QDialog;
class QGroupBox;
class QLabel;
class QLineEdit;
class QProgressBar;
class QPushButton;
class QRadioButton;
class QTimer;
class QToolButton;
class QTreeView;

namespace kest::desktop {
class StatusLine;
}

namespace kest {

class MessageListModel;

/// The controls of frmMessageList, which derives from this class and connects their events.
class MessageListControls {
protected:
    /// Creates the controls in a window and gives it the size that shows all columns.
    explicit MessageListControls(QDialog* owner);

    QRadioButton* optionOf(MessageFolder folder) const { return Option1[static_cast<size_t>(folder)]; }
    /// Fits the columns to the width of the window, until the user has chosen their widths.
    void fitColumns();

    std::array<QRadioButton*, 3> Option1;
    QGroupBox* Frame1;
    QGroupBox* Frame2;
    QLabel* Label1;
    QLineEdit* txtFilter;
    QPushButton* Command1;
    QLineEdit* txtFind;
    QTreeView* ListView1;
    MessageListModel* messages;
    desktop::StatusLine* lblStatus;
    QToolButton* cmdHeld;
    QProgressBar* prgFill;
    QPushButton* cmdProcess;
    QPushButton* cmdView;
    QPushButton* cmdPrint;
    QPushButton* Command6;
    QPushButton* cmdExit;
    QTimer* tmrRefresh;

private:
    void buildFolders();
    void buildList();
    void buildActions();
    void arrange();

    QDialog& form;
    int around = 0;            // pixels that the window needs beside the columns
    QList<int> fittedColumns;  // their widths, as long as the user has chosen no others
};

}  // namespace kest

#include "messagelist/frmMessageList.h"

#include "base/History.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "inbound/modLoadXML.h"
#include "messagelist/MessageListModel.h"
#include "messagelist/TakeIn.h"
#include "messagelist/frmHeld.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "messages/MessageTypes.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "recovery/Recovery.h"
#include "reports/PrintXML.h"
#include "utilities/frmViewXML.h"

#include <QClipboard>
#include <QDropEvent>
#include <QGroupBox>
#include <QGuiApplication>
#include <QLabel>
#include <QLineEdit>
#include <QLocale>
#include <QMimeData>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScopedValueRollback>
#include <QSet>
#include <QShortcut>
#include <QThread>
#include <QTimer>
#include <QToolButton>
#include <QTreeView>

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

const QLocale& written()
{
    static const QLocale locale(QLocale::English, QLocale::Australia);
    return locale;
}

}  // namespace

frmMessageList::frmMessageList() : Form(u"frmMessageList"_s, u"KEST Messages"_s), MessageListControls(this)
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    setAcceptDrops(true);
    connectControls();
}

void frmMessageList::connectControls()
{
    for (const MessageFolder folder : messageFolders)
        on(optionOf(folder), &QRadioButton::clicked, u"Option1_Click"_s, [this, folder] { Option1_Click(folder); });
    on(ListView1->selectionModel(), &QItemSelectionModel::currentRowChanged, u"ListView1_ItemClick"_s,
       [this](const QModelIndex& current, const QModelIndex&) {
           if (current.isValid())
               ListView1_ItemClick(current.row());
       });
    on(ListView1, &QTreeView::doubleClicked, u"ListView1_DblClick"_s, [this] { ListView1_DblClick(); });
    on(cmdProcess, &QPushButton::clicked, u"cmdProcess_Click"_s, [this] { cmdProcess_Click(); });
    on(cmdView, &QPushButton::clicked, u"cmdView_Click"_s, [this] { cmdView_Click(); });
    on(cmdPrint, &QPushButton::clicked, u"cmdPrint_Click"_s, [this] { cmdPrint_Click(); });
    on(cmdHeld, &QToolButton::clicked, u"cmdHeld_Click"_s, [this] { cmdHeld_Click(); });
    on(Command1, &QPushButton::clicked, u"Command1_Click"_s, [this] { Command1_Click(); });
    on(txtFilter, &QLineEdit::returnPressed, u"txtFilter_KeyDown"_s, [this] { Command1_Click(); });
    on(Command6, &QPushButton::clicked, u"Command6_Click"_s, [this] { Command6_Click(); });
    on(cmdExit, &QPushButton::clicked, u"cmdExit_Click"_s, [this] { close(); });
    on(tmrRefresh, &QTimer::timeout, u"tmrRefresh_Timer"_s, [this] { tmrRefresh_Timer(); });

    const auto inList = [this](Qt::Key key) {
        return new QShortcut(key, ListView1, nullptr, nullptr, Qt::WidgetShortcut);
    };
    on(inList(Qt::Key_Delete), &QShortcut::activated, u"Command6_Click"_s, [this] { Command6_Click(); });
    for (const Qt::Key enter : {Qt::Key_Return, Qt::Key_Enter})
        on(inList(enter), &QShortcut::activated, u"ListView1_DblClick"_s, [this] { ListView1_DblClick(); });
    on(txtFind, &QLineEdit::textChanged, u"txtFind_Change"_s, [this] { txtFind_Change(); });
    on(new QShortcut(Qt::Key_F5, this), &QShortcut::activated, u"Form_KeyRefresh"_s, [this] { Form_KeyRefresh(); });
    on(new QShortcut(QKeySequence::Paste, this), &QShortcut::activated, u"Form_Paste"_s, [this] { Form_Paste(); });
    on(new QShortcut(QKeySequence::Find, this), &QShortcut::activated, u"Form_Find"_s, [this] {
        txtFind->setFocus();
        txtFind->selectAll();
    });
}

void frmMessageList::ShowForm()
{
    frmMessageList window;
    window.openUnread();
    desktop::showModal(window);
}

void frmMessageList::openUnread()
{
    iFolder = MessageFolder::Unread;
    optionOf(MessageFolder::Unread)->setChecked(true);
    RefreshList();
    attempt([] { journal::prune(); });  // if it fails, the next opening does it
}

void frmMessageList::chooseFolder(MessageFolder folder)
{
    optionOf(folder)->setChecked(true);
    Option1_Click(folder);
}

void frmMessageList::updateFilter(const QString& filter)
{
    txtFilter->setText(filter);
    Command1_Click();
}

bool frmMessageList::loadFile(const QString& file)
{
    if (!isBareName(file) || (select(file) && !cmdProcess->isEnabled()))
        return false;
    const bool loaded = load(file);
    if (tmrRefresh->isActive()) {
        tmrRefresh->stop();
        QThread::msleep(static_cast<unsigned long>(tmrRefresh->interval()));
        tmrRefresh_Timer();
    }
    return loaded;
}

bool frmMessageList::reprintFile(const QString& file)
{
    if (select(file) && !cmdPrint->isEnabled())
        return false;
    sCurFile = file;
    return cmdPrint_Click();
}

void frmMessageList::RefreshList()
{
    settled.clear();
    refill();
}

void frmMessageList::refill()
{
    gdicQuoteRequests.clear();
    fill();
}

void frmMessageList::fill()
{
    const QScopedValueRollback filling(busy, busy + 1);
    QList<ListedMessage> listed;
    fillFailure.clear();
    isStopped = false;
    heldBack.clear();
    {
        const QString what = u"Reading the messages... (Esc stops)"_s;
        desktop::Progress progress(windowTitle(), what, prgFill, desktop::Stop::ByEscape);
        FillHooks hooks;
        hooks.submissionResponse = LoadSubmissionResponse;
        hooks.filterAsked = [this](const QString& filter) { txtFilter->setText(filter); };
        hooks.held = [this](const HeldMessage& message) { heldBack.append(message); };
        hooks.progress = [&](qint64 done, qint64 total) {
            if (progress.isShown())
                lblStatus->tell(what);
            isStopped = !progress.step(done, total) && done < total;
            return !isStopped;
        };
        try {
            EnsureConnection();
            recovery::settle();
            takeRowFailure();
            listed = BuildMessageList(iFolder, hooks);
            fillFailure = takeRowFailure();
        } catch (const RuntimeError& error) {
            fillFailure = error.description();
            heldBack.clear();
        }
    }
    messages->setMessages(std::move(listed), iFolder);
    choose(0);
    for (const recovery::Settled& operation : recovery::takeSettled())
        settled.append(operation.sentence());
    cmdHeld->setText((isStopped ? u"%1 or more held back (F4)"_s : u"%1 held back (F4)"_s).arg(heldBack.size()));
    cmdHeld->setShortcut(Qt::Key_F4);  // a new text takes the key away
    cmdHeld->setVisible(!heldBack.isEmpty());
    tellStatus();
}

const QList<ListedMessage>& frmMessageList::rows() const
{
    return messages->messages();
}

QString frmMessageList::status() const
{
    if (!fillFailure.isEmpty())
        return (rows().isEmpty() ? "The list could not be filled: "_L1 : "Values are missing in the list: "_L1) +
               fillFailure;
    const QString matching = gsListFilter.isEmpty() ? QString() : u" with \"%1\" in their name"_s.arg(gsListFilter);
    const qsizetype all = rows().size();
    if (all == 0 && !isStopped)
        return "No "_L1 + wordOf(iFolder) + " messages"_L1 + matching;
    const QString counted = written().toString(all) + (all == 1 ? " message"_L1 : " messages"_L1) + matching;
    const QString found =
        txtFind->text().isEmpty() ? counted : written().toString(messages->rowCount()) + " of "_L1 + counted;
    return isStopped ? found + "; not all, because Esc has stopped the reading (F5 reads all)"_L1 : found;
}

void frmMessageList::tell(const QString& text)
{
    lblStatus->tell(text, heldBack.isEmpty() ? QString() : cmdHeld->text());
}

void frmMessageList::tellStatus()
{
    tell((settled + QStringList(status())).join(u' '));
}

void frmMessageList::Option1_Click(MessageFolder folder)
{
    txtFind->clear();
    gsListFilter.clear();
    sCurFile.clear();
    gbFilterAsked = false;
    txtFilter->clear();
    iFolder = folder;
    RefreshList();
    cmdProcess->setVisible(folder == MessageFolder::Unread);
    cmdPrint->setVisible(folder == MessageFolder::Read);
    Frame2->setVisible(folder != MessageFolder::Unread);
}

void frmMessageList::ListView1_ItemClick(int row)
{
    sCurFile = messages->file(row);
    const auto isOf = [type = messages->type(row)](MessageCode code) { return type == messageType(code).name; };
    if (gbTabletLocal)  // a tablet on its own database loads new work only
        cmdProcess->setEnabled(isOf(MessageCode::QREQ));
    cmdPrint->setEnabled(!isOf(MessageCode::RRQT) && !isOf(MessageCode::QTDL) && !isOf(MessageCode::QRCN));
}

void frmMessageList::ListView1_DblClick()
{
    if (iFolder == MessageFolder::Sent)
        cmdView_Click();
}

void frmMessageList::cmdProcess_Click()
{
    if (hasSelection())
        load(selectedFile());
}

/// Loads a message and moves it, or only moves it if it was loaded before. `alone` keeps others from loading it
/// meanwhile; it is taken again if a box was open until the connection was lost.
bool frmMessageList::loadOnce(const QString& file, std::optional<db::Lock>& alone)
{
    const int generation = gConn->generation();
    QString text = files::read(gsCurFolder + file);
    const QString hash = journal::hashOf(text);
    switch (recovery::settleLoadOf(file, hash)) {
        case recovery::EarlierLoad::Complete:
            return true;
        case recovery::EarlierLoad::Pending:
            throw RuntimeError(RowChanged,
                               u"The last load of %1 was interrupted and could not be settled yet."_s.arg(file));
        case recovery::EarlierLoad::None:
            break;
    }
    journal::Operation operation(journal::Kind::Load, file, hash);
    operation.beforeFirstChange([&] {
        if (gConn->generation() == generation)
            return;
        alone.emplace(gConn, recovery::loadLock(file));
        if (!alone->isHeld() || !files::exists(gsUnreadPath + file) ||
            recovery::settleLoadOf(file, hash) != recovery::EarlierLoad::None)
            throw RuntimeError(RowChanged,
                               u"Message %1 is being loaded, or was loaded, on another workstation."_s.arg(file));
    });
    if (!LoadXML(text, file))
        return false;
    text.clear();  // otherwise a large text would be in memory twice
    // a report may have been open for hours, and the file's new name comes from the database
    attempt([] { EnsureConnection(); });
    MoveMessage(file, u"read"_s);
    operation.end(isMoved(file) ? journal::State::Done : journal::State::Unfinished);
    return true;
}

bool frmMessageList::load(const QString& file)
{
    const QScopedValueRollback loading(busy, busy + 1);
    const desktop::WaitPointer pointer(u"Loading %1..."_s.arg(file));
    const KeptMessage kept;
    try {
        EnsureConnection();
        std::optional<db::Lock> alone(std::in_place, gConn, recovery::loadLock(file));
        if (!alone->isHeld())
            desktop::msgBox(u"Message %1 is being loaded on another workstation."_s.arg(file),
                            desktop::Icon::Information);
        if (!alone->isHeld() || !loadOnce(file, alone)) {
            RefreshList();
            tmrRefresh->start();
            return false;
        }
        RefreshList();
        if (!isMoved(file))
            tell(
                u"%1 is loaded, but could not be moved to the read messages: it is moved as soon as that "
                "is possible."_s.arg(file));
        desktop::msgBox(u"Message Loaded"_s);
        return true;
    } catch (const RuntimeError& error) {
        LogError(error, u"frmMessageList.cmdProcess_Click"_s, u"cmdProcess_Click"_s);
        return false;
    }
}

void frmMessageList::cmdHeld_Click()
{
    frmHeld::ShowForm(heldBack);
}

void frmMessageList::tmrRefresh_Timer()
{
    if (busy)
        tmrRefresh->start();
    else
        refill();  // what the last fill has settled stays to be read
}

void frmMessageList::cmdView_Click()
{
    if (hasSelection())
        frmViewXML::ShowForm(selectedFile());
}

bool frmMessageList::cmdPrint_Click()
{
    return PrintXML(sCurFile, true);
}

void frmMessageList::Command1_Click()
{
    gsListFilter = txtFilter->text();
    gbFilterAsked = true;
    fill();
}

void frmMessageList::Command6_Click()
{
    if (!hasSelection())
        return;
    const QString file = selectedFile();
    if (!desktop::ask("You are about to remove "_L1 + file + " without loading into the system. Are you SURE ?"_L1,
                      desktop::Icon::Critical, {}, desktop::Answer::No))
        return;
    files::remove(gsCurFolder + file);
    if (sCurFile == file)
        sCurFile.clear();
    RefreshList();
}

void frmMessageList::txtFind_Change()
{
    const QString chosen = selectedFile();
    messages->search(txtFind->text());
    if (messages->rowCount() == 0)
        sCurFile.clear();  // a hidden message can't be reprinted
    choose(qMax(messages->rowOf(chosen), 0));
    tellStatus();
}

// Keeps the selected message, unlike the refreshes after a load or a deletion.
void frmMessageList::Form_KeyRefresh()
{
    const QString chosen = selectedFile();
    RefreshList();
    choose(qMax(messages->rowOf(chosen), 0));
}

void frmMessageList::Form_Paste()
{
    const QMimeData* clipboard = QGuiApplication::clipboard()->mimeData();
    if (iFolder != MessageFolder::Unread)
        tell(u"Files can be taken in only while the unread messages are shown."_s);
    else if (!clipboard || !clipboard->hasUrls())
        tell(u"The clipboard contains no files."_s);
    else
        takeIn(clipboard->urls());
}

void frmMessageList::dragEnterEvent(QDragEnterEvent* event)
{
    if (iFolder != MessageFolder::Unread || busy || !event->mimeData()->hasUrls())
        return;
    event->setDropAction(Qt::CopyAction);  // with a move, the source program would delete the files
    event->accept();
    tell(u"Let go to take the files in."_s);
}

void frmMessageList::dragLeaveEvent(QDragLeaveEvent*)
{
    tellStatus();
}

void frmMessageList::dropEvent(QDropEvent* event)
{
    event->setDropAction(Qt::CopyAction);
    event->accept();
    // after the drop has ended: a box would block the program that the files come from
    QTimer::singleShot(0, this, [this, brought = event->mimeData()->urls()] {
        desktop::guarded(u"frmMessageList.ListView1_OLEDragDrop"_s, [&] { takeIn(brought); });
    });
}

void frmMessageList::takeIn(const QList<QUrl>& brought)
{
    const QScopedValueRollback taking(busy, busy + 1);
    TakenIn taken;
    {
        desktop::Progress progress(windowTitle(), u"Taking the files in..."_s, prgFill);
        taken = takeInFiles(brought, [&](qint64 done, qint64 total) { progress.step(done, total); });
    }
    Form_KeyRefresh();
    const QSet<QString> toList(taken.toList.begin(), taken.toList.end());
    const qsizetype waiting =
        std::ranges::count_if(heldBack, [&](const HeldMessage& message) { return toList.contains(message.file); });
    const QString held = u" %1 not listed yet: held back by missing pictures or an earlier message."_s;
    tell(taken.summary() + (waiting > 0 ? held.arg(waiting) : QString()) + u' ' + lblStatus->text());
    if (!taken.refused.isEmpty())
        desktop::msgBox(taken.refusals(), desktop::Icon::Exclamation);
}

bool frmMessageList::hasSelection() const
{
    const QModelIndex row = ListView1->currentIndex();
    return row.isValid() && ListView1->selectionModel()->isSelected(row);  // Ctrl+click deselects the current row
}

QString frmMessageList::selectedFile() const
{
    return hasSelection() ? messages->file(ListView1->currentIndex().row()) : QString();
}

// Acts as a click on the row. Does nothing if there is no such row.
void frmMessageList::choose(int row)
{
    ListView1->setCurrentIndex(messages->index(row, 0));
}

// Acts as a click on the file's row. Returns false if the list does not show it.
bool frmMessageList::select(const QString& file)
{
    const int row = messages->rowOf(file);
    if (row < 0)
        return false;
    choose(row);
    return true;
}

void frmMessageList::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    fitColumns();
}

// The sort order of the last session is restored when the window is shown, so the first row is known only now.
void frmMessageList::showEvent(QShowEvent* event)
{
    Form::showEvent(event);
    if (!event->spontaneous())
        choose(0);
}

}  // namespace kest

#include "messages/frmMessageList.h"

#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "messages/ListSearch.h"
#include "messages/MessageListModel.h"
#include "messages/TakeIn.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Lists.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Prompt.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "reports/PrintXML.h"
#include "shell/SharedVariables.h"
#include "shell/modDBAccess.h"
#include "shell/modLoggerEx.h"
#include "utilities/frmViewXML.h"

#include <QClipboard>
#include <QDropEvent>
#include <QGroupBox>
#include <QGuiApplication>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QLocale>
#include <QMimeData>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScopedValueRollback>
#include <QScreen>
#include <QShortcut>
#include <QThread>
#include <QTimer>
#include <QTreeView>
#include <QVBoxLayout>

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr int refreshDelay = 250;    // milliseconds
constexpr int listMargin = 210;      // twips, left and right of the list
constexpr int openingHeight = 9000;  // twips
constexpr int filterWidth = 1800;    // twips
constexpr int findWidth = 2700;      // twips

constexpr std::array columnWidths{2328, 3969, 1587, 2293, 3969, 2117, 5292};  // twips

struct Folder {
    QString caption;
    QString word;
};

const std::array<Folder, 3> folders{{{u"U&nread"_s, u"unread"_s}, {u"R&ead"_s, u"read"_s}, {u"&Sent"_s, u"sent"_s}}};

const QLocale& written()
{
    static const QLocale locale(QLocale::English, QLocale::Australia);
    return locale;
}

template <class Control>
Control* named(Control* control, const QString& name, const QString& tip = {})
{
    control->setObjectName(name);
    control->setToolTip(tip);
    return control;
}

}  // namespace

frmMessageList::frmMessageList() : Form(u"frmMessageList"_s, u"KEST Messages"_s)
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    setAcceptDrops(true);
    buildControls();
    arrange();
    connectControls();
}

void frmMessageList::ShowForm()
{
    frmMessageList window;
    window.open();
    desktop::showModal(window);
}

void frmMessageList::buildControls()
{
    Frame1 = named(new QGroupBox, u"Frame1"_s);
    Frame1->setAccessibleName(u"Folder"_s);
    for (size_t i = 0; i < Option1.size(); ++i)
        Option1[i] = named(new QRadioButton(folders[i].caption), u"Option1(%1)"_s.arg(i),
                           "Show the "_L1 + folders[i].word + " messages"_L1);
    Option1[Unread]->setChecked(true);

    Frame2 = named(new QGroupBox, u"Frame2"_s);
    Frame2->setAccessibleName(u"Filter"_s);
    Label1 = named(new QLabel(u"&Filter :"_s), u"Label1"_s);
    txtFilter = named(new QLineEdit, u"txtFilter"_s, u"Show the messages with this text in their file name (Enter)"_s);
    txtFilter->setMinimumWidth(desktop::pixels(filterWidth));
    Label1->setBuddy(txtFilter);
    Command1 = named(new QPushButton(u"&Update"_s), u"Command1"_s, u"Fill the list by the filter"_s);
    Frame2->setVisible(false);

    txtFind =
        named(new QLineEdit, u"txtFind"_s, u"Show the rows with this text in any column; or just type in the list"_s);
    txtFind->setAccessibleName(u"Find"_s);
    txtFind->setPlaceholderText(u"Find (Ctrl+F)"_s);
    txtFind->setClearButtonEnabled(true);
    txtFind->setMinimumWidth(desktop::pixels(findWidth));

    ListView1 = named(new QTreeView, u"ListView1"_s);
    ListView1->setAccessibleName(u"Messages"_s);
    messages = new MessageListModel(this);
    ListView1->setModel(messages);
    desktop::prepareList(*ListView1, objectName());
    ListView1->header()->setSortIndicatorClearable(true);  // back to the order of the folder
    for (size_t i = 0; i < columnWidths.size(); ++i)
        ListView1->header()->resizeSection(static_cast<int>(i), desktop::pixels(columnWidths[i]));
    new ListSearch(*ListView1, *txtFind);

    lblStatus = named(new QLabel, u"lblStatus"_s);
    lblStatus->setTextFormat(Qt::PlainText);  // it shows file names
    lblStatus->setWordWrap(true);
    prgFill = named(new QProgressBar, u"prgFill"_s);
    prgFill->setAccessibleName(u"Progress"_s);
    prgFill->setVisible(false);

    cmdProcess = named(new QPushButton(u"&Load"_s), u"cmdProcess"_s, u"Take the message into the quotes"_s);
    cmdPrint = named(new QPushButton(u"Re&print"_s), u"cmdPrint"_s, u"Show the message's report"_s);
    cmdPrint->setVisible(false);
    cmdView = named(new QPushButton(u"&View"_s), u"cmdView"_s, u"Show the message's text"_s);
    Command6 = named(new QPushButton(u"&Delete"_s), u"Command6"_s, u"Remove the message's file (Del)"_s);
    cmdExit = desktop::exitButton(this, u"cmdExit"_s, u"Close (Esc)"_s);

    tmrRefresh = new QTimer(this);
    tmrRefresh->setObjectName(u"tmrRefresh"_s);
    tmrRefresh->setSingleShot(true);
    tmrRefresh->setInterval(refreshDelay);
}

void frmMessageList::arrange()
{
    auto* options = new QHBoxLayout(Frame1);
    for (QRadioButton* option : Option1)
        options->addWidget(option);
    auto* filter = new QHBoxLayout(Frame2);
    filter->addWidget(Label1);
    filter->addWidget(txtFilter);
    filter->addWidget(Command1);

    auto* top = new QHBoxLayout;
    top->addWidget(Frame1);
    top->addWidget(Frame2);
    top->addStretch();
    top->addWidget(Command6);

    auto* line = new QHBoxLayout;
    line->addWidget(lblStatus, 1);
    line->addWidget(prgFill);
    line->addWidget(txtFind);

    auto* bottom = new QHBoxLayout;
    bottom->addWidget(cmdProcess);
    bottom->addWidget(cmdPrint);
    bottom->addWidget(cmdView);  // moves to the left where neither of the two is shown
    bottom->addStretch();
    bottom->addWidget(cmdExit);

    auto* all = new QVBoxLayout(this);
    const int margin = desktop::pixels(listMargin);
    all->setContentsMargins(margin, margin, margin, margin);
    all->addLayout(top);
    all->addWidget(ListView1, 1);
    all->addLayout(line);
    all->addLayout(bottom);

    const QList<QWidget*> order{Option1[Unread], Option1[Read], Option1[Sent], txtFilter, Command1, ListView1,
                                txtFind,         cmdProcess,    cmdPrint,      cmdView,   Command6, cmdExit};
    for (qsizetype i = 1; i < order.size(); ++i)
        setTabOrder(order[i - 1], order[i]);
    ListView1->setFocus();

    int width = 2 * margin + ListView1->verticalScrollBar()->sizeHint().width() + 2 * ListView1->frameWidth();
    for (const int column : columnWidths)
        width += desktop::pixels(column);
    resize(QSize(width, desktop::pixels(openingHeight)).boundedTo(screen()->availableSize()));
}

void frmMessageList::connectControls()
{
    const auto on = [this](auto* sender, auto signal, const QString& event, auto routine) {
        desktop::onEvent(sender, signal, this, "frmMessageList."_L1 + event, routine);
    };
    for (size_t i = 0; i < Option1.size(); ++i)
        on(Option1[i], &QRadioButton::clicked, u"Option1_Click"_s, [this, i] { Option1_Click(static_cast<int>(i)); });
    on(ListView1->selectionModel(), &QItemSelectionModel::currentRowChanged, u"ListView1_ItemClick"_s,
       [this](const QModelIndex& current, const QModelIndex&) {
           if (current.isValid())
               ListView1_ItemClick(current.row());
       });
    on(ListView1, &QTreeView::doubleClicked, u"ListView1_DblClick"_s, [this] { ListView1_DblClick(); });
    on(cmdProcess, &QPushButton::clicked, u"cmdProcess_Click"_s, [this] { cmdProcess_Click(); });
    on(cmdView, &QPushButton::clicked, u"cmdView_Click"_s, [this] { cmdView_Click(); });
    on(cmdPrint, &QPushButton::clicked, u"cmdPrint_Click"_s, [this] { cmdPrint_Click(); });
    on(Command1, &QPushButton::clicked, u"Command1_Click"_s, [this] { Command1_Click(); });
    on(txtFilter, &QLineEdit::returnPressed, u"txtFilter_KeyDown"_s, [this] { Command1_Click(); });
    on(Command6, &QPushButton::clicked, u"Command6_Click"_s, [this] { Command6_Click(); });
    on(cmdExit, &QPushButton::clicked, u"cmdExit_Click"_s, [this] { close(); });
    on(tmrRefresh, &QTimer::timeout, u"tmrRefresh_Timer"_s, [this] { tmrRefresh_Timer(); });

    const auto inList = [this](Qt::Key key) {
        return new QShortcut(key, ListView1, nullptr, nullptr, Qt::WidgetShortcut);
    };
    on(inList(Qt::Key_Delete), &QShortcut::activated, u"Command6_Click"_s, [this] { Command6_Click(); });
    on(inList(Qt::Key_Return), &QShortcut::activated, u"ListView1_DblClick"_s, [this] { ListView1_DblClick(); });
    on(txtFind, &QLineEdit::textChanged, u"txtFind_Change"_s, [this] { txtFind_Change(); });
    on(new QShortcut(Qt::Key_F5, this), &QShortcut::activated, u"Form_KeyRefresh"_s, [this] { Form_KeyRefresh(); });
    on(new QShortcut(QKeySequence::Paste, this), &QShortcut::activated, u"Form_Paste"_s, [this] { Form_Paste(); });
    on(new QShortcut(QKeySequence::Find, this), &QShortcut::activated, u"Form_Find"_s, [this] {
        txtFind->setFocus();
        txtFind->selectAll();
    });
}

void frmMessageList::open()
{
    iFolder = Unread;
    Option1[Unread]->setChecked(true);
    RefreshList();
}

void frmMessageList::chooseFolder(int folder)
{
    Option1[folder]->setChecked(true);
    Option1_Click(folder);
}

void frmMessageList::updateFilter(const QString& filter)
{
    txtFilter->setText(filter);
    Command1_Click();
}

bool frmMessageList::loadFile(const QString& file)
{
    if (!IsBareName(file) || (select(file) && !cmdProcess->isEnabled()))
        return false;
    const bool loaded = load(file);
    if (tmrRefresh->isActive()) {
        tmrRefresh->stop();
        QThread::msleep(refreshDelay);
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
    gdicQuoteRequests.clear();
    fill();
}

void frmMessageList::fill()
{
    const QScopedValueRollback filling(busy, busy + 1);
    QList<ListedMessage> listed;
    fillFailure.clear();
    {
        desktop::Progress progress(windowTitle(), u"Reading the messages..."_s, prgFill);
        FillHooks hooks;
        hooks.submissionResponse = LoadSubmissionResponse;
        hooks.filterAsked = [this](const QString& filter) { txtFilter->setText(filter); };
        hooks.progress = [&](qint64 done, qint64 total) { progress.step(done, total); };
        try {
            EnsureConnection();
            listed = BuildMessageList(iFolder, hooks);
        } catch (const RuntimeError& error) {
            fillFailure = error.description();
        }
    }
    messages->setMessages(std::move(listed));
    choose(0);
    lblStatus->setText(status());
}

const QList<ListedMessage>& frmMessageList::rows() const
{
    return messages->messages();
}

QString frmMessageList::status() const
{
    if (!fillFailure.isEmpty())
        return "The list could not be filled: "_L1 + fillFailure;
    const QString matching = gsListFilter.isEmpty() ? QString() : u" with \"%1\" in their name"_s.arg(gsListFilter);
    const qsizetype all = rows().size();
    if (all == 0)
        return "No "_L1 + folders[iFolder].word + " messages"_L1 + matching;
    const QString counted = written().toString(all) + (all == 1 ? " message"_L1 : " messages"_L1) + matching;
    return txtFind->text().isEmpty() ? counted : written().toString(messages->rowCount()) + " of "_L1 + counted;
}

void frmMessageList::Option1_Click(int index)
{
    txtFind->clear();
    gsListFilter.clear();
    sCurFile.clear();
    gbFilterAsked = false;
    txtFilter->clear();
    iFolder = index;
    RefreshList();
    cmdProcess->setVisible(index == Unread);
    cmdPrint->setVisible(index == Read);
    Frame2->setVisible(index != Unread);
}

void frmMessageList::ListView1_ItemClick(int row)
{
    sCurFile = messages->file(row);
    const QString type = messages->type(row);
    if (gbTabletLocal)  // on its own database a tablet takes new work only
        cmdProcess->setEnabled(type == "Quote Request"_L1);
    cmdPrint->setEnabled(type != "Request for Revised Quote"_L1 && type != "Quote Deletion"_L1 &&
                         type != "Quote Request Cancellation"_L1);
}

void frmMessageList::ListView1_DblClick()
{
    if (iFolder == Sent)
        cmdView_Click();
}

void frmMessageList::cmdProcess_Click()
{
    if (hasSelection())
        load(selectedFile());
}

bool frmMessageList::load(const QString& file)
{
    const QScopedValueRollback loading(busy, busy + 1);
    try {
        QString text = files::read(gsCurFolder + file);
        if (!LoadXML(text, file)) {
            RefreshList();
            tmrRefresh->start();
            return false;
        }
        MoveMessage(file, u"read"_s);
        RefreshList();
        desktop::msgBox(u"Message Loaded"_s);
        return true;
    } catch (const RuntimeError& error) {
        LogError(error, u"frmMessageList.cmdProcess_Click"_s, u"cmdProcess_Click"_s);
        return false;
    }
}

void frmMessageList::tmrRefresh_Timer()
{
    if (busy)
        tmrRefresh->start();
    else
        RefreshList();
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
        sCurFile.clear();  // what is not seen can't be reprinted
    choose(qMax(messages->rowOf(chosen), 0));
    lblStatus->setText(status());
}

// A refresh that the user asks for keeps the user's place, other than those that follow a load or a deletion.
void frmMessageList::Form_KeyRefresh()
{
    const QString chosen = selectedFile();
    RefreshList();
    choose(qMax(messages->rowOf(chosen), 0));
}

void frmMessageList::Form_Paste()
{
    const QMimeData* clipboard = QGuiApplication::clipboard()->mimeData();
    if (iFolder != Unread)
        lblStatus->setText(u"Files are taken in while the unread messages are shown."_s);
    else if (!clipboard || !clipboard->hasUrls())
        lblStatus->setText(u"The clipboard holds no files."_s);
    else
        takeIn(clipboard->urls());
}

void frmMessageList::dragEnterEvent(QDragEnterEvent* event)
{
    if (iFolder != Unread || busy || !event->mimeData()->hasUrls())
        return;
    event->setDropAction(Qt::CopyAction);  // whoever drags must not take the files away
    event->accept();
    lblStatus->setText(u"Let go to take the files in."_s);
}

void frmMessageList::dragLeaveEvent(QDragLeaveEvent*)
{
    lblStatus->setText(status());
}

void frmMessageList::dropEvent(QDropEvent* event)
{
    event->setDropAction(Qt::CopyAction);
    event->accept();
    // after the drop: a box would keep the program that the files come from waiting
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
        taken = TakeInFiles(brought, [&](qint64 done, qint64 total) { progress.step(done, total); });
    }
    Form_KeyRefresh();
    const qsizetype waiting = taken.toList.size() - std::ranges::count_if(rows(), [&](const ListedMessage& message) {
                                  return taken.toList.contains(message.file);
                              });
    const QString held = u" %1 not listed yet: held back by missing pictures or an earlier message."_s;
    lblStatus->setText(taken.summary() + (waiting > 0 && fillFailure.isEmpty() ? held.arg(waiting) : QString()) + u' ' +
                       lblStatus->text());
    if (!taken.refused.isEmpty())
        desktop::msgBox(taken.refusals(), desktop::Icon::Exclamation);
}

bool frmMessageList::hasSelection() const
{
    return ListView1->currentIndex().isValid();
}

QString frmMessageList::selectedFile() const
{
    return hasSelection() ? messages->file(ListView1->currentIndex().row()) : QString();
}

// As a click on the row; nothing where there is none.
void frmMessageList::choose(int row)
{
    ListView1->setCurrentIndex(messages->index(row, 0));
}

// As a click on the file's row; false where the list does not show it.
bool frmMessageList::select(const QString& file)
{
    const int row = messages->rowOf(file);
    if (row < 0)
        return false;
    choose(row);
    return true;
}

// The order that is remembered from the last time is there only now.
void frmMessageList::showEvent(QShowEvent* event)
{
    Form::showEvent(event);
    if (!event->spontaneous())
        choose(0);
}

}  // namespace kest

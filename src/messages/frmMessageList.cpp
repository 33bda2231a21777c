#include "messages/frmMessageList.h"

#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Prompt.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "reports/PrintXML.h"
#include "shell/SharedVariables.h"
#include "shell/modDBAccess.h"
#include "shell/modLoggerEx.h"
#include "utilities/frmViewXML.h"

#include <QCollator>
#include <QElapsedTimer>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QLocale>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScopedValueRollback>
#include <QScreen>
#include <QShortcut>
#include <QThread>
#include <QTimer>
#include <QTreeWidget>
#include <QVBoxLayout>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr int refreshDelay = 250;    // milliseconds
constexpr int quietFill = 500;       // milliseconds that a fill may take before it shows how far it is
constexpr int listMargin = 210;      // twips, left and right of the list
constexpr int openingHeight = 9000;  // twips

enum Column { FileColumn, TypeColumn };

struct ListColumn {
    QLatin1StringView caption;
    int width;  // twips
};

constexpr ListColumn columns[] = {
    {"Filename"_L1, 2328}, {"Message Type"_L1, 3969}, {"Rego"_L1, 1587},         {"Claim No"_L1, 2293},
    {"Customer"_L1, 3969}, {"Quote No"_L1, 2117},     {"Vehicle Desc"_L1, 5292},
};

struct Folder {
    QString caption;
    QString word;
};

const std::array<Folder, 3> folders{{{u"U&nread"_s, u"unread"_s}, {u"R&ead"_s, u"read"_s}, {u"&Sent"_s, u"sent"_s}}};

/// Sorts "123.0_9" before "123.0_10".
class MessageItem final : public QTreeWidgetItem {
public:
    using QTreeWidgetItem::QTreeWidgetItem;

    bool operator<(const QTreeWidgetItem& other) const override
    {
        static const QCollator collator = [] {
            QCollator natural(QLocale(QLocale::English, QLocale::Australia));  // numbers need a language's rules
            natural.setNumericMode(true);
            return natural;
        }();
        const int column = treeWidget()->sortColumn();
        return collator.compare(text(column), other.text(column)) < 0;
    }
};

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
    Label1->setBuddy(txtFilter);
    Command1 = named(new QPushButton(u"&Update"_s), u"Command1"_s, u"Fill the list by the filter"_s);
    Frame2->setVisible(false);

    ListView1 = named(new QTreeWidget, u"ListView1"_s);
    ListView1->setAccessibleName(u"Messages"_s);
    ListView1->setRootIsDecorated(false);
    ListView1->setUniformRowHeights(true);
    ListView1->setAllColumnsShowFocus(true);
    QStringList captions;
    for (const ListColumn& column : columns)
        captions << column.caption;
    ListView1->setHeaderLabels(captions);
    ListView1->header()->setStretchLastSection(false);
    for (int i = 0; i < captions.size(); ++i)
        ListView1->header()->resizeSection(i, desktop::pixels(columns[i].width));
    ListView1->header()->setSortIndicator(-1,
                                          Qt::AscendingOrder);  // in the order of the folder until a header is clicked

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
                                cmdProcess,      cmdPrint,      cmdView,       Command6,  cmdExit};
    for (qsizetype i = 1; i < order.size(); ++i)
        setTabOrder(order[i - 1], order[i]);
    ListView1->setFocus();

    int width = 2 * margin + ListView1->verticalScrollBar()->sizeHint().width() + 2 * ListView1->frameWidth();
    for (const ListColumn& column : columns)
        width += desktop::pixels(column.width);
    resize(QSize(width, desktop::pixels(openingHeight)).boundedTo(screen()->availableSize()));
}

void frmMessageList::connectControls()
{
    const auto on = [this](auto* sender, auto signal, const QString& event, auto routine) {
        desktop::onEvent(sender, signal, this, "frmMessageList."_L1 + event, routine);
    };
    for (size_t i = 0; i < Option1.size(); ++i)
        on(Option1[i], &QRadioButton::clicked, u"Option1_Click"_s, [this, i] { Option1_Click(static_cast<int>(i)); });
    on(ListView1, &QTreeWidget::currentItemChanged, u"ListView1_ItemClick"_s,
       [this](const QTreeWidgetItem* item, const QTreeWidgetItem*) {
           if (item)
               ListView1_ItemClick(*item);
       });
    on(ListView1, &QTreeWidget::itemDoubleClicked, u"ListView1_DblClick"_s, [this] { ListView1_DblClick(); });
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
    on(new QShortcut(Qt::Key_F5, this), &QShortcut::activated, u"RefreshList"_s, [this] { RefreshList(); });
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
    QElapsedTimer since;
    since.start();
    FillHooks hooks;
    hooks.submissionResponse = LoadSubmissionResponse;
    hooks.filterAsked = [this](const QString& filter) { txtFilter->setText(filter); };
    hooks.progress = [&](qint64 done, qint64 total) {
        if (since.elapsed() > quietFill)
            showProgress(done, total);
    };

    listed.clear();
    fillFailure.clear();
    try {
        EnsureConnection();
        listed = BuildMessageList(iFolder, hooks);
    } catch (const RuntimeError& error) {
        fillFailure = error.description();
    }
    prgFill->setVisible(false);
    showRows();
    lblStatus->setText(status());
}

void frmMessageList::showRows()
{
    ListView1->setSortingEnabled(false);
    ListView1->clear();
    QList<QTreeWidgetItem*> items;
    items.reserve(listed.size());
    for (const ListedMessage& message : std::as_const(listed)) {
        QStringList texts{message.file};
        texts.append(QStringList(message.row.begin(), message.row.end()));
        items.append(new MessageItem(texts));
    }
    ListView1->addTopLevelItems(items);
    ListView1->setSortingEnabled(true);
    if (QTreeWidgetItem* first = ListView1->topLevelItem(0))
        ListView1->setCurrentItem(first);  // as if it had been clicked
}

void frmMessageList::showProgress(qint64 done, qint64 total)
{
    constexpr qint64 steps = 100;
    if (!isVisible())
        return;
    if (prgFill->isHidden()) {
        prgFill->setRange(0, steps);
        prgFill->setVisible(true);
        layout()->activate();
    }
    prgFill->setValue(static_cast<int>(done * steps / total));  // paints itself, so that no event has to be let in
}

QString frmMessageList::status() const
{
    if (!fillFailure.isEmpty())
        return "The list could not be filled: "_L1 + fillFailure;
    const QString matching = gsListFilter.isEmpty() ? QString() : u" with \"%1\" in their name"_s.arg(gsListFilter);
    if (listed.isEmpty())
        return "No "_L1 + folders[iFolder].word + " messages"_L1 + matching;
    return QString::number(listed.size()) + (listed.size() == 1 ? " message"_L1 : " messages"_L1) + matching;
}

void frmMessageList::Option1_Click(int index)
{
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

void frmMessageList::ListView1_ItemClick(const QTreeWidgetItem& item)
{
    sCurFile = item.text(FileColumn);
    const QString type = item.text(TypeColumn);
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
    if (ListView1->currentItem())
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
    if (ListView1->currentItem())
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
    if (!ListView1->currentItem())
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

QString frmMessageList::selectedFile() const
{
    return ListView1->currentItem()->text(FileColumn);
}

// As a click on the file's row; false where the list does not show it.
bool frmMessageList::select(const QString& file)
{
    const QList<QTreeWidgetItem*> found = ListView1->findItems(file, Qt::MatchFixedString);
    if (found.isEmpty())
        return false;
    ListView1->setCurrentItem(found.first());
    return true;
}

}  // namespace kest

#include "messagelist/MessageListControls.h"

#include "messagelist/MessageListModel.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/ListSearch.h"
#include "platform/desktop/Lists.h"
#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"

#include <QDialog>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScreen>
#include <QScrollBar>
#include <QTimer>
#include <QToolButton>
#include <QTreeView>
#include <QVBoxLayout>

#include <algorithm>
#include <numeric>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr int refreshDelay = 250;    // milliseconds
constexpr int listMargin = 210;      // twips, left and right of the list
constexpr int openingHeight = 9000;  // twips
constexpr int filterWidth = 1800;    // twips
constexpr int findWidth = 2700;      // twips

constexpr std::array columnWidths{2328, 3969, 1587, 2293, 3969, 2117, 5292};  // twips

QString captionOf(MessageFolder folder)
{
    switch (folder) {
        case MessageFolder::Unread:
            return u"U&nread"_s;
        case MessageFolder::Read:
            return u"R&ead"_s;
        case MessageFolder::Sent:
            break;
    }
    return u"&Sent"_s;
}

template <class Control>
Control* named(Control* control, const QString& name, const QString& tip = {})
{
    control->setObjectName(name);
    control->setToolTip(tip);
    return control;
}

}  // namespace

MessageListControls::MessageListControls(QDialog* owner) : form(*owner)
{
    buildFolders();
    buildList();
    buildActions();
    arrange();
}

void MessageListControls::buildFolders()
{
    Frame1 = named(new QGroupBox, u"Frame1"_s);
    Frame1->setAccessibleName(u"Folder"_s);
    for (size_t i = 0; i < Option1.size(); ++i)
        Option1[i] = named(new QRadioButton(captionOf(messageFolders[i])), u"Option1(%1)"_s.arg(i),
                           "Show the "_L1 + wordOf(messageFolders[i]) + " messages"_L1);
    optionOf(MessageFolder::Unread)->setChecked(true);

    Frame2 = named(new QGroupBox, u"Frame2"_s);
    Frame2->setAccessibleName(u"Filter"_s);
    Label1 = named(new QLabel(u"&Filter :"_s), u"Label1"_s);
    txtFilter = named(new QLineEdit, u"txtFilter"_s, u"Show the messages with this text in their file name (Enter)"_s);
    txtFilter->setMinimumWidth(desktop::pixels(filterWidth));
    Label1->setBuddy(txtFilter);
    Command1 = named(new QPushButton(u"&Update"_s), u"Command1"_s, u"Fill the list by the filter"_s);
    QSizePolicy place = Frame2->sizePolicy();
    place.setRetainSizeWhenHidden(true);  // so that nothing moves when it appears
    Frame2->setSizePolicy(place);
    Frame2->setVisible(false);
}

void MessageListControls::buildList()
{
    txtFind =
        named(new QLineEdit, u"txtFind"_s, u"Show the rows with this text in any column; or just type in the list"_s);
    txtFind->setAccessibleName(u"Find"_s);
    txtFind->setPlaceholderText(u"Find (Ctrl+F)"_s);
    txtFind->setClearButtonEnabled(true);
    txtFind->setMinimumWidth(desktop::pixels(findWidth));

    ListView1 = named(new QTreeView, u"ListView1"_s);
    ListView1->setAccessibleName(u"Messages"_s);
    messages = new MessageListModel(&form);
    ListView1->setModel(messages);
    ListView1->setSelectionMode(QAbstractItemView::ExtendedSelection);  // for copying; the buttons use the current row
    desktop::prepareList(*ListView1, form.objectName());
    ListView1->header()->setSortIndicatorClearable(true);  // back to the order of the folder
    new desktop::ListSearch(*ListView1, *txtFind);

    lblStatus = new desktop::StatusLine(u"lblStatus"_s);
    lblStatus->setWordWrap(true);
    cmdHeld = named(new QToolButton, u"cmdHeld"_s, u"Show the messages that are not listed yet (F4)"_s);
    cmdHeld->setAutoRaise(true);
    cmdHeld->setVisible(false);
    prgFill = named(new QProgressBar, u"prgFill"_s);
    prgFill->setAccessibleName(u"Progress"_s);
    prgFill->setVisible(false);
}

void MessageListControls::buildActions()
{
    cmdProcess = named(new QPushButton(u"&Load"_s), u"cmdProcess"_s, u"Load the message into the quotes"_s);
    cmdPrint = named(new QPushButton(u"Re&print"_s), u"cmdPrint"_s, u"Show the message's report"_s);
    cmdPrint->setVisible(false);
    cmdView = named(new QPushButton(u"&View"_s), u"cmdView"_s, u"Show the message's text"_s);
    Command6 = named(new QPushButton(u"&Delete"_s), u"Command6"_s, u"Remove the message's file (Del)"_s);
    cmdExit = desktop::exitButton(&form, u"cmdExit"_s, u"Close (Esc)"_s);
    desktop::addListMenu(*ListView1, form.objectName(), {cmdProcess, cmdPrint, cmdView, Command6});

    tmrRefresh = new QTimer(&form);
    tmrRefresh->setObjectName(u"tmrRefresh"_s);
    tmrRefresh->setSingleShot(true);
    tmrRefresh->setInterval(refreshDelay);
}

void MessageListControls::arrange()
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
    line->addWidget(cmdHeld);
    line->addWidget(prgFill);
    line->addWidget(txtFind);

    auto* bottom = new QHBoxLayout;
    bottom->addWidget(cmdProcess);
    bottom->addWidget(cmdPrint);
    bottom->addWidget(cmdView);  // moves to the left if neither of the two is shown
    bottom->addStretch();
    bottom->addWidget(cmdExit);

    auto* all = new QVBoxLayout(&form);
    const int margin = desktop::pixels(listMargin);
    all->setContentsMargins(margin, margin, margin, margin);
    all->addLayout(top);
    all->addWidget(ListView1, 1);
    all->addLayout(line);
    all->addLayout(bottom);

    const QList<QWidget*> order{Option1[0], Option1[1], Option1[2], txtFilter, Command1, ListView1, cmdHeld,
                                txtFind,    cmdProcess, cmdPrint,   cmdView,   Command6, cmdExit};
    for (qsizetype i = 1; i < order.size(); ++i)
        QWidget::setTabOrder(order[i - 1], order[i]);
    ListView1->setFocus();

    around = 2 * margin + ListView1->verticalScrollBar()->sizeHint().width() + 2 * ListView1->frameWidth();
    int width = around;
    for (const int column : columnWidths)
        width += desktop::pixels(column);
    form.resize(QSize(width, desktop::pixels(openingHeight)).boundedTo(form.screen()->availableSize()));
    fitColumns();
}

// In a window that is too narrow for the columns, all of them get narrower, the widest ones most: a long text has a
// tool tip. Columns whose width the user has chosen stay.
void MessageListControls::fitColumns()
{
    QHeaderView* header = ListView1->header();
    const auto sizes = [header] {
        QList<int> all;
        for (int i = 0; i + 1 < header->count(); ++i)  // the last one takes the space that is left
            all.append(header->sectionSize(i));
        return all;
    };
    if (!fittedColumns.isEmpty() && sizes() != fittedColumns)
        return;
    QList<int> widths;
    for (const int column : columnWidths)
        widths.append(desktop::pixels(column));
    const int all = std::accumulate(widths.begin(), widths.end(), 0);
    const int room = qMin(form.width() - around, all);
    int longestCaption = header->minimumSectionSize();
    for (int i = 0; i < header->count(); ++i) {
        const int caption = qMax(header->sectionSizeHint(i), header->minimumSectionSize());
        longestCaption = qMax(longestCaption, caption);
        widths[i] = qMax(widths[i] * room / all, caption);
    }
    for (int excess = std::accumulate(widths.begin(), widths.end(), 0) - room; excess > 0; --excess)
        if (const auto widest = std::ranges::max_element(widths); *widest > longestCaption)
            --*widest;
    for (int i = 0; i < header->count(); ++i)
        header->resizeSection(i, widths[i]);
    fittedColumns = sizes();
}

}  // namespace kest

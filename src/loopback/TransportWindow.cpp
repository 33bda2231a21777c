#include "loopback/TransportWindow.h"

#include "platform/desktop/Lists.h"
#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"

#include <QApplication>
#include <QDeadlineTimer>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QScrollBar>
#include <QThread>
#include <QTime>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr int mostRows = 2000;
constexpr int longestCall = 1000;  // milliseconds until an open window has noticed
constexpr int pollInterval = 20;

QString callIn(const TransportFolders& folders)
{
    return folders.own + u"KESTWeb.call"_s;
}

}  // namespace

TransportWindow::TransportWindow(const TransportFolders& folders)
    : Form(u"KESTWeb"_s, u"KESTWeb"_s),
      runner(folders, [this](const Carry& carry) { tell(carry); }),
      call(callIn(folders))
{
    auto* heading = new QLabel(u"C&arried between the shop and the insurer:"_s, this);
    carriedList = new QTreeWidget(this);
    carriedList->setObjectName(u"carriedList"_s);
    carriedList->setAccessibleName(u"Carried files"_s);
    carriedList->setHeaderLabels({u"Time"_s, u"Direction"_s, u"File"_s, u"What it is"_s});
    desktop::prepareList(*carriedList, objectName());
    carriedList->setColumnWidth(0, desktop::pixels(1200));
    carriedList->setColumnWidth(1, desktop::pixels(2000));
    carriedList->setColumnWidth(2, desktop::pixels(3900));
    desktop::addListMenu(*carriedList, objectName(), {});
    heading->setBuddy(carriedList);

    status = new desktop::StatusLine(u"status"_s);
    status->setWordWrap(true);

    carryButton = new QPushButton(u"Carry &Now"_s, this);
    carryButton->setObjectName(u"carryButton"_s);
    desktop::onEvent(carryButton, &QPushButton::clicked, this, u"KESTWeb.carryNow_clicked"_s,
                     [this] { runner.carryNow(); });
    closeButton = new QPushButton(u"&Close"_s, this);
    closeButton->setObjectName(u"closeButton"_s);
    desktop::onEvent(closeButton, &QPushButton::clicked, this, u"KESTWeb.close_clicked"_s, [this] { close(); });

    auto* buttons = new QHBoxLayout;
    buttons->addWidget(status, 1);
    buttons->addWidget(carryButton);
    buttons->addWidget(closeButton);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(heading);
    layout->addWidget(carriedList);
    layout->addLayout(buttons);
    resize(desktop::pixels(11600, 5400));
}

bool TransportWindow::raiseOther(const TransportFolders& folders)
{
    const QString call = callIn(folders);
    files::writeBytes(call, {});
    const QDeadlineTimer deadline(longestCall);
    while (files::exists(call) && !deadline.hasExpired())
        QThread::msleep(pollInterval);
    return !attempt([&] { files::remove(call); });  // the window has removed it
}

void TransportWindow::comeIfCalled()
{
    if (!files::exists(call))
        return;
    files::remove(call);
    setWindowState(windowState() & ~Qt::WindowMinimized);
    raise();
    activateWindow();
    QApplication::alert(this);  // for desktops that let no window come to the front by itself
}

void TransportWindow::run()
{
    calls.addPath(files::systemPath(call.section(u'/', 0, -2)));
    desktop::onEvent(&calls, &QFileSystemWatcher::directoryChanged, this, u"KESTWeb.call"_s,
                     [this] { comeIfCalled(); });
    comeIfCalled();  // another start may have been faster
    const OnTermination termination([this] { close(); });
    runner.start();
    desktop::showModal(*this);
}

void TransportWindow::tell(const Carry& carry)
{
    for (const Carried& file : carry.carried)
        addRow({file.direction == Carried::Direction::Out ? u"To insurer"_s : u"To shop"_s, file.file, file.what});
    for (const QString& fault : carry.faults)
        addRow({u"Fault"_s, {}, fault});
    carriedFiles += int(carry.carried.size());
    const QString text = u"Last looked at %1; %2 carried so far."_s.arg(
        QTime::currentTime().toString(u"HH:mm:ss"_s),
        carriedFiles == 1 ? u"1 file"_s : u"%1 files"_s.arg(carriedFiles));
    if (carry.carried.isEmpty() && carry.faults.isEmpty())
        status->setText(text);  // every five seconds: too often for a screen reader
    else
        status->tell(text);
}

void TransportWindow::addRow(const QStringList& cells)
{
    auto* row = new QTreeWidgetItem(QStringList(QTime::currentTime().toString(u"HH:mm:ss"_s)) + cells);
    for (int column = 0; column < row->columnCount(); ++column)
        row->setToolTip(column, row->text(column));
    const QScrollBar* bar = carriedList->verticalScrollBar();
    const bool isEndVisible = bar->value() == bar->maximum();
    carriedList->addTopLevelItem(row);
    arrived.append(row);
    if (arrived.size() > mostRows)
        delete arrived.takeFirst();
    if (isEndVisible && !carriedList->itemBelow(row))  // otherwise the user reads other rows, or has sorted them
        carriedList->scrollToItem(row);
}

}  // namespace kest::app

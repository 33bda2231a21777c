#include "app/transport/frmTransport.h"

#include "platform/desktop/Window.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QTime>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {
constexpr int mostRows = 2000;
}

frmTransport::frmTransport(const TransportFolders& folders)
    : Form(u"frmTransport"_s, u"KESTWeb"_s), runner(folders, [this](const Carry& carry) { show(carry); })
{
    auto* heading = new QLabel(u"C&arried between the shop and the insurer:"_s, this);
    lvCarried = new QTreeWidget(this);
    lvCarried->setObjectName(u"lvCarried"_s);
    lvCarried->setAccessibleName(u"Carried files"_s);
    lvCarried->setHeaderLabels({u"Time"_s, u"Direction"_s, u"File"_s, u"What it is"_s});
    lvCarried->setRootIsDecorated(false);
    lvCarried->setUniformRowHeights(true);
    lvCarried->setColumnWidth(0, desktop::pixels(1100));
    lvCarried->setColumnWidth(1, desktop::pixels(1200));
    lvCarried->setColumnWidth(2, desktop::pixels(3900));
    heading->setBuddy(lvCarried);

    lblStatus = new QLabel(this);
    lblStatus->setObjectName(u"lblStatus"_s);
    lblStatus->setAccessibleName(u"Status"_s);
    lblStatus->setWordWrap(true);

    cmdCarry = new QPushButton(u"&Carry Now"_s, this);
    cmdCarry->setObjectName(u"cmdCarry"_s);
    desktop::onEvent(cmdCarry, &QPushButton::clicked, this, u"frmTransport.cmdCarry_Click"_s,
                     [this] { runner.carryNow(); });
    cmdClose = new QPushButton(u"C&lose"_s, this);
    cmdClose->setObjectName(u"cmdClose"_s);
    desktop::onEvent(cmdClose, &QPushButton::clicked, this, u"frmTransport.cmdClose_Click"_s, [this] { close(); });

    auto* buttons = new QHBoxLayout;
    buttons->addWidget(lblStatus, 1);
    buttons->addWidget(cmdCarry);
    buttons->addWidget(cmdClose);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(heading);
    layout->addWidget(lvCarried);
    layout->addLayout(buttons);
    resize(desktop::pixels(11000, 5400));
}

void frmTransport::ShowForm()
{
    const OnTermination termination([this] { close(); });
    runner.start();
    desktop::showModal(*this);
}

void frmTransport::show(const Carry& carry)
{
    for (const Carried& file : carry.carried)
        addRow({file.direction == Carried::Out ? u"To insurer"_s : u"To shop"_s, file.file, file.what});
    for (const QString& fault : carry.faults)
        addRow({u"Fault"_s, {}, fault});
    files += int(carry.carried.size());
    lblStatus->setText(u"Last looked at %1; %2 carried so far."_s.arg(
        QTime::currentTime().toString(u"HH:mm:ss"_s), files == 1 ? u"1 file"_s : u"%1 files"_s.arg(files)));
}

void frmTransport::addRow(const QStringList& cells)
{
    auto* row = new QTreeWidgetItem(QStringList(QTime::currentTime().toString(u"HH:mm:ss"_s)) + cells);
    for (int column = 0; column < row->columnCount(); ++column)
        row->setToolTip(column, row->text(column));
    lvCarried->addTopLevelItem(row);
    if (lvCarried->topLevelItemCount() > mostRows)
        delete lvCarried->takeTopLevelItem(0);
    lvCarried->scrollToItem(row);
}

}  // namespace kest::app

#include "messagelist/frmHeld.h"

#include "platform/desktop/Lists.h"
#include "platform/desktop/Window.h"
#include "utilities/frmViewXML.h"

#include <QHBoxLayout>
#include <QHeaderView>
#include <QPushButton>
#include <QTreeWidget>
#include <QVBoxLayout>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr int sinceColumn = 2;

/// A row of the list. Its times are sorted as times.
class HeldItem final : public QTreeWidgetItem {
public:
    HeldItem(QTreeWidget* list, const HeldMessage& message)
        : QTreeWidgetItem(list, {message.file, message.type, message.sinceText(), message.waitsFor})
    {
        setData(sinceColumn, Qt::UserRole, message.since);
        for (int column = 0; column < columnCount(); ++column)
            setToolTip(column, text(column));
    }

    bool operator<(const QTreeWidgetItem& other) const override
    {
        if (treeWidget()->sortColumn() != sinceColumn)
            return QTreeWidgetItem::operator<(other);
        return data(sinceColumn, Qt::UserRole).toDateTime() < other.data(sinceColumn, Qt::UserRole).toDateTime();
    }
};

}  // namespace

frmHeld::frmHeld(const QList<HeldMessage>& messages)
    : Form(u"frmHeld"_s, u"Held Messages"_s),
      ListView1(new QTreeWidget),
      cmdView(button(u"cmdView"_s, u"&View"_s, [this] { cmdView_Click(); })),
      cmdClose(button(u"cmdClose"_s, u"&Close"_s, [this] { close(); }))
{
    ListView1->setObjectName("ListView1"_L1);
    ListView1->setAccessibleName(u"Held messages"_s);
    ListView1->setHeaderLabels({u"Filename"_s, u"Message Type"_s, u"Since"_s, u"Waits For"_s});
    desktop::prepareList(*ListView1, objectName());
    constexpr std::array widths{2600, 2600, 2100};  // twips
    for (size_t column = 0; column < widths.size(); ++column)
        ListView1->setColumnWidth(static_cast<int>(column), desktop::pixels(widths[column]));
    for (const HeldMessage& message : messages)
        new HeldItem(ListView1, message);
    ListView1->setCurrentItem(ListView1->topLevelItem(0));
    cmdView->setDefault(true);
    desktop::addListMenu(*ListView1, objectName(), {cmdView});

    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(cmdView);
    buttons->addWidget(cmdClose);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(ListView1);
    layout->addLayout(buttons);
    resize(desktop::pixels(12000, 4800));

    on(ListView1, &QTreeWidget::itemDoubleClicked, u"ListView1_DblClick"_s, [this] { cmdView_Click(); });
}

void frmHeld::ShowForm(const QList<HeldMessage>& messages)
{
    frmHeld form(messages);
    desktop::showModal(form);
}

void frmHeld::cmdView_Click()
{
    if (const QTreeWidgetItem* row = ListView1->currentItem())
        frmViewXML::ShowForm(row->text(0));
}

}  // namespace kest

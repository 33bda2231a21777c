#include "utilities/frmHistory.h"

#include "base/modDBAccess.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/ListSearch.h"
#include "platform/desktop/Lists.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"

#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QShortcut>
#include <QTreeWidget>
#include <QVBoxLayout>

#include <algorithm>
#include <initializer_list>
#include <utility>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

enum OperationColumn { Number, Time };

/// Lets a text that is too long for its column be read whole.
void explainCells(QTreeWidgetItem& row)
{
    for (int column = 0; column < row.columnCount(); ++column)
        row.setToolTip(column, row.text(column));
}

/// A row of the upper list. Its times are sorted as times.
class OperationItem final : public QTreeWidgetItem {
public:
    explicit OperationItem(const journal::Entry& entry)
    {
        const QStringList cells{{},
                                entry.started.toString(u"dd/MM/yyyy HH:mm:ss"_s),
                                entry.workstation,
                                journal::titleOf(entry),
                                entry.state};
        for (int column = 0; column < cells.size(); ++column)
            setText(column, cells[column]);
        setData(Number, Qt::DisplayRole, entry.id);
        explainCells(*this);
    }

    qint64 operation() const { return data(Number, Qt::DisplayRole).toLongLong(); }

    bool operator<(const QTreeWidgetItem& other) const override
    {
        if (treeWidget()->sortColumn() == Time)
            return operation() < static_cast<const OperationItem&>(other).operation();
        return QTreeWidgetItem::operator<(other);
    }
};

bool contains(const QStringList& cells, const QString& text)
{
    return std::ranges::any_of(cells, [&](const QString& cell) { return cell.contains(text, Qt::CaseInsensitive); });
}

QStringList cellsOf(const QTreeWidgetItem& row)
{
    QStringList cells;
    for (int column = 0; column < row.columnCount(); ++column)
        cells.append(row.text(column));
    return cells;
}

QTreeWidget* newList(const QString& name, const QString& heard, const QStringList& headers, const QString& window,
                     std::initializer_list<int> widths)
{
    auto* list = new QTreeWidget;
    list->setObjectName(name);
    list->setAccessibleName(heard);
    list->setHeaderLabels(headers);
    list->setSelectionMode(QAbstractItemView::ExtendedSelection);
    desktop::prepareList(*list, window, Qt::WidgetShortcut);
    int column = 0;
    for (const int width : widths)
        list->setColumnWidth(column++, desktop::pixels(width));
    return list;
}

QLabel* labelOf(QWidget* list, const QString& caption)
{
    auto* label = new QLabel(caption);
    label->setBuddy(list);
    return label;
}

}  // namespace

frmHistory::frmHistory(const QString& number, Undo undoLoad)
    : Form(u"frmHistory"_s, u"History of Quote "_s + number),
      sQTNNO(number),
      undo(std::move(undoLoad)),
      ListView1(newList(u"ListView1"_s, u"Operations on the quote"_s,
                        {u"No."_s, u"Time"_s, u"Workstation"_s, u"Operation"_s, u"State"_s}, objectName(),
                        {900, 2400, 2100, 4200})),
      ListView2(newList(u"ListView2"_s, u"Changes of the operation"_s,
                        {u"Table"_s, u"Change"_s, u"Row"_s, u"Column"_s, u"From"_s, u"To"_s}, objectName(),
                        {1400, 1600, 2400, 1900, 2400})),
      txtFind(new QLineEdit),
      lblStatus(new desktop::StatusLine(u"lblStatus"_s)),
      cmdUndo(button(u"cmdUndo"_s, u"&Undo"_s, [this] { cmdUndo_Click(); })),
      cmdClose(button(u"cmdClose"_s, u"&Close"_s, [this] { close(); }))
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    txtFind->setObjectName("txtFind"_L1);
    txtFind->setAccessibleName(u"Find"_s);
    txtFind->setToolTip(u"Show what has this text in any column; or just type in the list of operations"_s);
    txtFind->setPlaceholderText(u"Find (Ctrl+F)"_s);
    txtFind->setClearButtonEnabled(true);
    new desktop::ListSearch(*ListView1, *txtFind);
    cmdUndo->setAccessibleName(u"Undo the chosen load"_s);
    cmdUndo->setToolTip(u"Take back all that the chosen load has changed, and make its message unread again"_s);
    cmdUndo->setVisible(bool(undo));
    desktop::addListMenu(*ListView1, objectName(), {cmdUndo});
    desktop::addListMenu(*ListView2, objectName(), {});
    arrange();

    on(txtFind, &QLineEdit::textChanged, u"txtFind_Change"_s, [this] { txtFind_Change(); });
    on(ListView1, &QTreeWidget::currentItemChanged, u"ListView1_ItemClick"_s, [this] { ListView1_ItemClick(); });
    on(new QShortcut(QKeySequence::Find, this), &QShortcut::activated, u"Form_Find"_s, [this] {
        txtFind->setFocus();
        txtFind->selectAll();
    });
    fill();
    ListView1->setFocus();
}

bool frmHistory::ShowForm(const QString& number, const Undo& undo)
{
    EnsureConnection();
    frmHistory form(number, undo);
    desktop::showModal(form);
    return form.isUndone;
}

void frmHistory::fill()
{
    ListView1->clear();
    for (const journal::Entry& entry : journal::historyOf(sQTNNO, {}))
        ListView1->addTopLevelItem(new OperationItem(entry));
    txtFind_Change();
}

void frmHistory::arrange()
{
    auto* top = new QHBoxLayout;
    top->addWidget(labelOf(ListView1, u"&Operations, newest first"_s));
    top->addStretch();
    top->addWidget(txtFind);
    txtFind->setMinimumWidth(desktop::pixels(3000));
    auto* bottom = new QHBoxLayout;
    bottom->addWidget(lblStatus, 1);
    bottom->addWidget(cmdUndo);
    bottom->addWidget(cmdClose);
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(top);
    layout->addWidget(ListView1, 2);
    layout->addWidget(labelOf(ListView2, u"C&hanges of the chosen operation"_s));
    layout->addWidget(ListView2, 3);
    layout->addLayout(bottom);
    resize(desktop::pixels(13500, 9000));
}

const QList<QStringList>& frmHistory::changesOf(qint64 operation)
{
    const auto known = changes.find(operation);
    if (known != changes.end())
        return known->second;
    EnsureConnection();
    QList<QStringList> rows;
    for (const journal::RecordedChange& change : journal::changesOf(operation))
        for (const journal::ColumnStory& column : journal::columnsOf(change.row))
            rows.append({change.row.table,
                         journal::wordOf(change.row.kind) + (change.isTakenBack ? u", taken back"_s : QString()),
                         journal::keyOf(change.row), column.name, column.from, column.to});
    return changes.emplace(operation, rows).first->second;
}

bool frmHistory::hasFoundText(qint64 operation)
{
    return std::ranges::any_of(changesOf(operation),
                               [&](const QStringList& cells) { return contains(cells, txtFind->text()); });
}

qint64 frmHistory::chosen() const
{
    const auto* row = static_cast<const OperationItem*>(ListView1->currentItem());
    return row && !row->isHidden() ? row->operation() : 0;
}

void frmHistory::txtFind_Change()
{
    OperationItem* first = nullptr;
    int visible = 0;
    for (int i = 0; i < ListView1->topLevelItemCount(); ++i) {
        auto* row = static_cast<OperationItem*>(ListView1->topLevelItem(i));
        const bool isFound =
            txtFind->text().isEmpty() || contains(cellsOf(*row), txtFind->text()) || hasFoundText(row->operation());
        row->setHidden(!isFound);
        visible += isFound;
        if (isFound && !first)
            first = row;
    }
    if (chosen() == 0)
        ListView1->setCurrentItem(first);
    ListView1_ItemClick();
    tellCount(visible);
}

void frmHistory::ListView1_ItemClick()
{
    ListView2->clear();
    const qint64 operation = chosen();
    cmdUndo->setEnabled(operation != 0);
    if (operation == 0)
        return;
    const bool areSome = hasFoundText(operation);  // otherwise the text was found in the operation itself
    for (const QStringList& cells : changesOf(operation)) {
        if (areSome && !contains(cells, txtFind->text()))
            continue;
        auto* row = new QTreeWidgetItem(ListView2, cells);
        explainCells(*row);
    }
    ListView2->setCurrentItem(ListView2->topLevelItem(0));
}

void frmHistory::cmdUndo_Click()
{
    EnsureConnection();
    const desktop::WaitPointer pointer(u"Undoing the load..."_s);
    const auto showUndone = [this] {
        EnsureConnection();  // it may have been lost while a box of the undo was open
        isUndone = true;
        changes.clear();  // they say now which were taken back
        fill();
    };
    try {
        if (!undo(chosen()))
            return;
    } catch (const RuntimeError&) {  // it may have failed half done
        attempt(showUndone);
        throw;
    }
    showUndone();
}

void frmHistory::tellCount(int visible)
{
    const int all = ListView1->topLevelItemCount();
    const QString counted = QString::number(all) + (all == 1 ? u" operation"_s : u" operations"_s);
    if (!journal::isKept())
        lblStatus->setText(u"This database keeps no journal."_s);
    else if (all == 0)
        lblStatus->setText(u"Nothing is recorded for quote %1."_s.arg(sQTNNO));
    else
        lblStatus->tell(txtFind->text().isEmpty() ? counted : u"%1 of %2"_s.arg(visible).arg(counted));
}

}  // namespace kest

#include "platform/desktop/Lists.h"

#include "platform/desktop/Colours.h"
#include "platform/desktop/Window.h"

#include <QClipboard>
#include <QGuiApplication>
#include <QHeaderView>
#include <QMenu>
#include <QPushButton>
#include <QShortcut>
#include <QTreeView>

#include <algorithm>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

constexpr int numberKeys = 9;

QKeySequence sortKeys(int column)
{
    return Qt::CTRL | static_cast<Qt::Key>(Qt::Key_1 + column);
}

/// Acts as a click on the header of the column.
void sortBy(QHeaderView& header, int column)
{
    const bool isSorted = header.sortIndicatorSection() == column;
    const bool isDescending = isSorted && header.sortIndicatorOrder() == Qt::DescendingOrder;
    if (isDescending && header.isSortIndicatorClearable())
        header.setSortIndicator(-1, Qt::AscendingOrder);
    else
        header.setSortIndicator(column, isSorted && !isDescending ? Qt::DescendingOrder : Qt::AscendingOrder);
}

void copyRows(const QTreeView& list)
{
    QModelIndexList rows = list.selectionModel()->selectedRows();
    std::sort(rows.begin(), rows.end());
    QStringList lines;
    for (const QModelIndex& row : std::as_const(rows)) {
        QStringList cells;
        for (int column = 0; column < row.model()->columnCount(); ++column)
            cells.append(row.siblingAtColumn(column).data().toString());
        lines.append(cells.join(u'\t'));
    }
    if (!lines.isEmpty())
        QGuiApplication::clipboard()->setText(lines.join(u'\n'));
}

}  // namespace

void prepareList(QTreeView& list, const QString& window, Qt::ShortcutContext keysOf)
{
    showFocus(list);
    list.setRootIsDecorated(false);
    list.setUniformRowHeights(true);
    list.setAllColumnsShowFocus(true);
    list.setAlternatingRowColors(true);
    QHeaderView* header = list.header();
    header->setMinimumSectionSize(header->sectionSizeHint(header->count() - 1));
    header->setStretchLastSection(true);
    header->setSortIndicator(-1, Qt::AscendingOrder);
    list.setSortingEnabled(true);

    const QString source = window + u'.' + list.objectName() + u"_ColumnClick"_s;
    onEvent(header, &QHeaderView::sortIndicatorChanged, &list, source, [&list] { list.scrollTo(list.currentIndex()); });
    for (int column = 0; column < qMin(header->count(), numberKeys); ++column) {
        list.model()->setHeaderData(column, Qt::Horizontal, sortTip(column), Qt::ToolTipRole);
        onEvent(new QShortcut(sortKeys(column), &list, nullptr, nullptr, keysOf), &QShortcut::activated, &list, source,
                [header, column] { sortBy(*header, column); });
    }
    auto* copy = new QShortcut(QKeySequence::Copy, &list, nullptr, nullptr, Qt::WidgetShortcut);
    onEvent(copy, &QShortcut::activated, &list, window + u'.' + list.objectName() + u"_Copy"_s,
            [&list] { copyRows(list); });
    auto* widen = new QShortcut(&list);
    widen->setContext(keysOf);
    widen->setKeys({Qt::CTRL | Qt::Key_Plus, Qt::CTRL | Qt::Key_Equal});  // "+" with and without Shift
    onEvent(widen, &QShortcut::activated, &list, source, [&list, header] {
        for (int column = 0; column < header->count(); ++column)
            list.resizeColumnToContents(column);
    });
}

QString sortTip(int column)
{
    return u"Sort by this column (%1)"_s.arg(sortKeys(column).toString(QKeySequence::NativeText));
}

void addListMenu(QTreeView& list, const QString& window, const QList<QPushButton*>& buttons)
{
    list.setContextMenuPolicy(Qt::CustomContextMenu);
    const QString source = window + u'.' + list.objectName() + u"_MouseUp"_s;
    onEvent(&list, &QTreeView::customContextMenuRequested, &list, source, [&list, buttons](const QPoint& place) {
        const bool isCurrentSelected = list.selectionModel()->isSelected(list.currentIndex());
        auto* menu = new QMenu(&list);
        menu->setAttribute(Qt::WA_DeleteOnClose);
        for (QPushButton* button : buttons) {
            if (!button->isVisible())
                continue;
            QAction* action = menu->addAction(button->text(), button, &QPushButton::click);
            action->setEnabled(button->isEnabled() && isCurrentSelected);
        }
        menu->addAction(u"&Copy\tCtrl+C"_s, &list, [&list] { copyRows(list); });
        menu->popup(list.viewport()->mapToGlobal(place));
    });
}

}  // namespace kest::desktop

#include "platform/desktop/Lists.h"

#include "platform/desktop/Window.h"

#include <QHeaderView>
#include <QShortcut>
#include <QTreeView>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

constexpr int numberKeys = 9;

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

}  // namespace

void prepareList(QTreeView& list, const QString& window)
{
    list.setRootIsDecorated(false);
    list.setUniformRowHeights(true);
    list.setAllColumnsShowFocus(true);
    list.setAlternatingRowColors(true);
    QHeaderView* header = list.header();
    header->setStretchLastSection(false);
    header->setSortIndicator(-1, Qt::AscendingOrder);
    list.setSortingEnabled(true);

    const QString source = window + u'.' + list.objectName() + u"_ColumnClick"_s;
    onEvent(header, &QHeaderView::sortIndicatorChanged, &list, source, [&list] { list.scrollTo(list.currentIndex()); });
    for (int column = 0; column < qMin(header->count(), numberKeys); ++column) {
        const QKeySequence keys(Qt::CTRL | static_cast<Qt::Key>(Qt::Key_1 + column));
        list.model()->setHeaderData(column, Qt::Horizontal,
                                    u"Sort by this column (%1)"_s.arg(keys.toString(QKeySequence::NativeText)),
                                    Qt::ToolTipRole);
        onEvent(new QShortcut(keys, &list, nullptr, nullptr, Qt::WindowShortcut), &QShortcut::activated, &list, source,
                [header, column] { sortBy(*header, column); });
    }
    auto* widen = new QShortcut(&list);
    widen->setKeys({Qt::CTRL | Qt::Key_Plus, Qt::CTRL | Qt::Key_Equal});  // "+" with and without Shift
    onEvent(widen, &QShortcut::activated, &list, source, [&list, header] {
        for (int column = 0; column < header->count(); ++column)
            list.resizeColumnToContents(column);
    });
}

}  // namespace kest::desktop

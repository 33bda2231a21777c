#include "platform/desktop/WindowLayout.h"

#include "platform/desktop/Window.h"
#include "platform/profile.h"

#include <QDialog>
#include <QDir>
#include <QFileInfo>
#include <QHeaderView>
#include <QScreen>
#include <QSettings>
#include <QTableView>
#include <QTreeView>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

QString layoutFile()
{
    return profile::root() + u"/windows.ini"_s;
}

/// Returns true if the user can choose the width of the column.
bool isFree(const QHeaderView& header, int column)
{
    const bool fillsTheRest = header.stretchLastSection() && header.visualIndex(column) == header.count() - 1;
    return header.sectionResizeMode(column) == QHeaderView::Interactive && !header.isSectionHidden(column) &&
           !fillsTheRest;
}

QStringList widths(const QHeaderView& header)
{
    QStringList result;
    for (int column = 0; column < header.count(); ++column)
        result.append(QString::number(isFree(header, column) ? twips(header.sectionSize(column)) : 0));
    return result;
}

void setWidths(QHeaderView& header, const QStringList& widths)
{
    if (widths.size() != header.count())
        return;  // the list had other columns then
    for (int column = 0; column < header.count(); ++column) {
        const int width = widths[column].toInt();
        if (width > 0 && isFree(header, column))
            header.resizeSection(column, pixels(width));
    }
}

QStringList sortOrder(const QHeaderView& header)
{
    return {QString::number(header.sortIndicatorSection()), QString::number(header.sortIndicatorOrder())};
}

void setSortOrder(QHeaderView& header, const QStringList& sort)
{
    if (sort.size() != 2)
        return;
    const int column = sort[0].toInt();
    if (column >= 0 && column < header.count())
        header.setSortIndicator(column,
                                sort[1].toInt() == Qt::DescendingOrder ? Qt::DescendingOrder : Qt::AscendingOrder);
}

}  // namespace

WindowLayout::WindowLayout(QDialog& dialog) : window(dialog)
{
    if (!window.objectName().isEmpty())
        restore();
    before = state();
}

void WindowLayout::restore()
{
    QSettings file(layoutFile(), QSettings::IniFormat);
    file.beginGroup(window.objectName());
    const QSize size = file.value(u"size"_s).toSize();  // in twips, like the widths, so that they fit any scale
    if (size.isValid())
        window.resize(pixels(size.width(), size.height())
                          .expandedTo(window.minimumSizeHint())
                          .boundedTo(window.screen()->availableSize()));
    const QMap<QString, QHeaderView*> lists = headers();
    for (auto list = lists.begin(); list != lists.end(); ++list) {
        setWidths(*list.value(), file.value(list.key() + u"/columns"_s).toStringList());
        if (list.value()->isSortIndicatorShown())
            setSortOrder(*list.value(), file.value(list.key() + u"/sort"_s).toStringList());
    }
}

void WindowLayout::remember() const
{
    const QDir folder(QFileInfo(layoutFile()).path());
    if (window.objectName().isEmpty() || folder.isEmpty())  // only an empty folder can become that of a new shop
        return;
    const State after = state();
    QSettings file(layoutFile(), QSettings::IniFormat);
    file.beginGroup(window.objectName());
    if (after.size != before.size && !window.isMaximized())
        file.setValue(u"size"_s, QSize(twips(after.size.width()), twips(after.size.height())));
    for (auto list = after.columns.begin(); list != after.columns.end(); ++list)
        if (list.value() != before.columns.value(list.key()))
            file.setValue(list.key() + u"/columns"_s, list.value());
    for (auto list = after.sort.begin(); list != after.sort.end(); ++list)
        if (list.value() != before.sort.value(list.key()))
            file.setValue(list.key() + u"/sort"_s, list.value());
}

WindowLayout::State WindowLayout::state() const
{
    State result{window.size(), {}, {}};
    const QMap<QString, QHeaderView*> lists = headers();
    for (auto list = lists.begin(); list != lists.end(); ++list) {
        result.columns.insert(list.key(), widths(*list.value()));
        if (list.value()->isSortIndicatorShown())
            result.sort.insert(list.key(), sortOrder(*list.value()));
    }
    return result;
}

QMap<QString, QHeaderView*> WindowLayout::headers() const
{
    QMap<QString, QHeaderView*> result;
    for (const QTreeView* list : window.findChildren<QTreeView*>())
        result.insert(list->objectName(), list->header());
    for (const QTableView* list : window.findChildren<QTableView*>())
        result.insert(list->objectName(), list->horizontalHeader());
    result.remove({});
    return result;
}

}  // namespace kest::desktop

#include "messagelist/MessageListModel.h"

#include "platform/desktop/Lists.h"
#include "platform/files/files.h"

#include <QCollator>
#include <QDateTime>
#include <QFileInfo>
#include <QLocale>

#include <algorithm>
#include <numeric>
#include <utility>
#include <vector>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr std::array captions{"Filename"_L1, "Message Type"_L1, "Rego"_L1,        "Claim No"_L1,
                              "Customer"_L1, "Quote No"_L1,     "Vehicle Desc"_L1};

constexpr QChar betweenCells(u'\x1f');  // so that no match spans two cells

const QCollator& naturalOrder()
{
    static const QCollator collator = [] {
        QCollator natural(QLocale(QLocale::English, QLocale::Australia));  // numeric mode does not work in the C locale
        natural.setNumericMode(true);
        return natural;
    }();
    return collator;
}

/// Returns what happened when a file of the folder was written.
QString eventOf(MessageFolder folder)
{
    switch (folder) {
        case MessageFolder::Unread:
            return u"Arrived"_s;
        case MessageFolder::Read:
            return u"Loaded"_s;
        case MessageFolder::Sent:
            break;
    }
    return u"Written"_s;
}

}  // namespace

void MessageListModel::setMessages(QList<ListedMessage> messages, MessageFolder theirFolder)
{
    beginResetModel();
    folder = theirFolder;
    all = std::move(messages);
    texts.clear();
    texts.reserve(all.size());
    for (const ListedMessage& message : std::as_const(all)) {
        QString text = message.file;
        for (const QString& value : message.row)
            text += betweenCells + value;
        texts.append(text.toCaseFolded());
    }
    putInOrder();
    narrow();
    endResetModel();
}

void MessageListModel::search(const QString& text)
{
    if (text.toCaseFolded() == wanted)
        return;
    beginResetModel();
    wanted = text.toCaseFolded();
    narrow();
    endResetModel();
}

void MessageListModel::sort(int column, Qt::SortOrder order)
{
    emit layoutAboutToBeChanged({}, VerticalSortHint);
    const QModelIndexList before = persistentIndexList();
    QList<qsizetype> places;
    for (const QModelIndex& index : before)
        places.append(shown[index.row()]);
    sortColumn = column;
    sortOrder = order;
    putInOrder();
    narrow();
    QModelIndexList after;
    for (qsizetype i = 0; i < before.size(); ++i)
        after.append(index(static_cast<int>(shown.indexOf(places[i])), before[i].column()));
    changePersistentIndexList(before, after);
    emit layoutChanged({}, VerticalSortHint);
}

void MessageListModel::putInOrder()
{
    ordered.resize(all.size());
    std::iota(ordered.begin(), ordered.end(), 0);
    if (sortColumn < 0)
        return;
    std::vector<QCollatorSortKey> keys;
    keys.reserve(static_cast<size_t>(all.size()));
    for (qsizetype i = 0; i < all.size(); ++i)
        keys.push_back(naturalOrder().sortKey(cell(i, sortColumn)));
    const bool descending = sortOrder == Qt::DescendingOrder;
    std::ranges::stable_sort(ordered, [&](qsizetype a, qsizetype b) {
        const int comparison = keys[static_cast<size_t>(a)].compare(keys[static_cast<size_t>(b)]);
        return descending ? comparison > 0 : comparison < 0;
    });
}

void MessageListModel::narrow()
{
    shown = ordered;
    if (!wanted.isEmpty())
        shown.removeIf([this](qsizetype message) { return !texts[message].contains(wanted); });
}

int MessageListModel::rowOf(const QString& file) const
{
    const auto found = std::ranges::find_if(
        shown, [&](qsizetype message) { return all[message].file.compare(file, Qt::CaseInsensitive) == 0; });
    return found == shown.end() ? -1 : static_cast<int>(found - shown.begin());
}

int MessageListModel::rowCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : static_cast<int>(shown.size());
}

int MessageListModel::columnCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : static_cast<int>(captions.size());
}

QString MessageListModel::cell(qsizetype message, int column) const
{
    const ListedMessage& listed = all[message];
    return column == 0 ? listed.file : listed.row[static_cast<size_t>(column) - 1].trimmed();
}

QVariant MessageListModel::data(const QModelIndex& index, int role) const
{
    if (!index.isValid() || (role != Qt::DisplayRole && role != Qt::ToolTipRole))
        return {};
    const QString text = cell(shown[index.row()], index.column());
    if (role == Qt::DisplayRole || index.column() > 0)
        return text;
    const QDateTime time = QFileInfo(files::systemPath(pathOf(folder) + text)).lastModified();
    return time.isValid() ? text + u'\n' + eventOf(folder) + time.toString(u" dd/MM/yyyy HH:mm"_s) : text;
}

QVariant MessageListModel::headerData(int section, Qt::Orientation orientation, int role) const
{
    if (orientation == Qt::Horizontal && role == Qt::ToolTipRole)
        return desktop::sortTip(section);
    if (orientation == Qt::Vertical || role != Qt::DisplayRole)
        return QAbstractTableModel::headerData(section, orientation, role);
    return QString(captions[static_cast<size_t>(section)]);
}

}  // namespace kest

// The rows of the message list as the window shows them: sorted by a column and filtered by a search.
#pragma once

#include "messagelist/Summary.h"

#include <QAbstractTableModel>

namespace kest {

/// A model of the listed messages. Rows that the search hides are not part of the model, so a user can neither select
/// nor load them.
class MessageListModel final : public QAbstractTableModel {
    Q_OBJECT
public:
    using QAbstractTableModel::QAbstractTableModel;

    /// Replaces the messages by those of a folder. The sort order and the search stay.
    void setMessages(QList<ListedMessage> messages, MessageFolder theirFolder);
    /// All messages, hidden ones included, in the order of the folder.
    const QList<ListedMessage>& messages() const { return all; }

    /// Shows only the rows that contain `text` in one of their columns, in any case. An empty text shows all rows.
    void search(const QString& text);
    /// Sorts by a column in natural order, "123.0_9" before "123.0_10". A column below 0 restores the folder's order.
    void sort(int column, Qt::SortOrder order = Qt::AscendingOrder) override;

    /// Returns the file of a shown row.
    QString file(int row) const { return all[shown[row]].file; }
    /// Returns the message type of a shown row.
    QString type(int row) const { return all[shown[row]].row[0]; }
    /// Returns the row that shows `file`, whose case is ignored, or -1 if no row does.
    int rowOf(const QString& file) const;

    int rowCount(const QModelIndex& parent = {}) const override;
    int columnCount(const QModelIndex& parent = {}) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role = Qt::DisplayRole) const override;

private:
    QString cell(qsizetype message, int column) const;
    void putInOrder();
    void narrow();

    MessageFolder folder = MessageFolder::Unread;
    QList<ListedMessage> all;  // in the folder's order
    QStringList texts;         // the searchable text of each message
    QList<qsizetype> ordered;  // indexes into `all`, sorted
    QList<qsizetype> shown;    // those of `ordered` that match the search
    QString wanted;            // the searched text, case-folded
    int sortColumn = -1;
    Qt::SortOrder sortOrder = Qt::AscendingOrder;
};

}  // namespace kest

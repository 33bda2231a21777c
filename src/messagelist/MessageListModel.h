// The rows of the message list as they are shown: in the order of a column, narrowed by a search.
#pragma once

#include "messagelist/Summary.h"

#include <QAbstractTableModel>

namespace kest {

/// Rows that a search leaves out are not there for whoever looks at the model: they can be neither chosen nor loaded.
class MessageListModel final : public QAbstractTableModel {
    Q_OBJECT
public:
    enum Column { FileColumn, TypeColumn };

    using QAbstractTableModel::QAbstractTableModel;

    /// The rows of a fill; order and search stay.
    void setMessages(QList<ListedMessage> messages);
    const QList<ListedMessage>& messages() const { return all; }

    /// Leaves the rows that hold the text in one of their columns, in any case; the empty text leaves all.
    void search(const QString& text);
    /// In the natural order of a column, "123.0_9" before "123.0_10"; in the folder's own for a column below 0.
    void sort(int column, Qt::SortOrder order = Qt::AscendingOrder) override;

    /// The file and the message type of a shown row.
    QString file(int row) const { return all[shown[row]].file; }
    QString type(int row) const { return all[shown[row]].row[0]; }
    /// The row that shows a file, its name taken in any case; -1 where none does.
    int rowOf(const QString& file) const;

    int rowCount(const QModelIndex& parent = {}) const override;
    int columnCount(const QModelIndex& parent = {}) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role = Qt::DisplayRole) const override;

private:
    QString cell(qsizetype message, int column) const;
    void putInOrder();
    void narrow();

    QList<ListedMessage> all;  // in the folder's order
    QStringList texts;         // of each message its cells, for the search
    QList<qsizetype> ordered;  // places in `all`
    QList<qsizetype> shown;    // those of `ordered` that the search leaves
    QString wanted;            // folded
    int sortColumn = -1;
    Qt::SortOrder sortOrder = Qt::AscendingOrder;
};

}  // namespace kest

// The data of a recordset, shared by the recordset and its writer.
#pragma once

#include "platform/RuntimeError.h"
#include "platform/database/Criterion.h"
#include "platform/database/Recordset.h"
#include "platform/database/Session.h"

#include <QHash>

#include <optional>
#include <vector>

namespace kest::db {

/// The rows with the same value, in order.
using Bucket = std::vector<int>;
using Index = QHash<QString, Bucket>;

[[noreturn]] void failNoCurrentRow();

/// The rows of a recordset, its position and its pending change.
struct Recordset::Data {
    enum class Pending { None, Change, Insert };

    ConnectionPtr connection;
    QString select;
    bool isOpen = false;
    bool declared = false;
    bool disconnected = false;

    QList<ResultColumn> columns;
    QHash<QString, int> columnNumbers;  // as columnNumbers() returns them
    std::vector<QVariant> values;       // all rows one after the other, including removed ones
    std::vector<int> rows;              // the rows that have not been removed
    std::vector<int> visible;           // the rows that the filter shows
    int position = 0;                   // index into `visible`; -1 before the first row

    Pending pending = Pending::None;
    std::vector<QVariant> original;  // the values before the pending change
    std::vector<bool> assigned;

    QList<Criterion> filter;
    QHash<int, Index> indexes;  // by column; created by the first search that needs it

    void requireOpen() const
    {
        if (!isOpen)
            throw RuntimeError(ObjectClosed, QStringLiteral("Operation is not allowed when the object is closed."));
    }

    bool hasRow() const { return position >= 0 && position < int(visible.size()); }

    int row() const
    {
        requireOpen();
        if (!hasRow())
            failNoCurrentRow();
        return visible[size_t(position)];
    }

    QVariant& at(int row, int column) { return values[size_t(row) * size_t(columns.size()) + size_t(column)]; }

    int columnNumber(const QString& name) const
    {
        auto found = columnNumbers.constFind(name);
        if (found == columnNumbers.constEnd())
            found = columnNumbers.constFind(name.toLower());
        if (found == columnNumbers.constEnd())
            throw RuntimeError(NoSuchColumn,
                               QStringLiteral("Item cannot be found in the collection corresponding to the "
                                              "requested name or ordinal: ") +
                                   name);
        return *found;
    }

    Session& session() const
    {
        if (disconnected)
            throw RuntimeError(ObjectClosed,
                               QStringLiteral("The rows live without a connection and can't be updated."));
        if (!connection)
            throw RuntimeError(NoObject, QStringLiteral("Object variable or With block variable not set"));
        return connection->session();
    }

    const Dialect& dialect() const { return session().dialect(); }

    void fetch();
    void showFiltered();
    bool isShown(int row);

    const Index& indexOf(int column);
    void findKey(int column, const std::optional<QString>& key);
    void store(int row, int column, const QVariant& value);
    void beginChange();
    void forgetChange();
    void dropCurrentRow();

    class Writer;
};

}  // namespace kest::db

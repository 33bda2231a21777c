// The rows of a query, read and changed one at a time, with the behaviour of a client-side cursor.
#pragma once

#include "platform/database/Connection.h"

#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>

namespace kest::db {

enum class Kind { Text, LongText, WholeNumber, Number, Flag, Date };

/// A query fetched whole when it is opened. Columns are found without regard to case; of two columns with one name the
/// first in select order counts. Values have one C++ type for each kind on every engine: text QString, whole number
/// qint64, number double, flag bool, date QDateTime; Null is a null QVariant.
///
/// A pending change is written by `update`, by any move, find or requery, and discarded by `close`.
class Recordset {
public:
    Recordset();
    /// A null connection is accepted here; `open` then throws NoObject.
    explicit Recordset(ConnectionPtr connection);
    ~Recordset();
    Recordset(Recordset&&) noexcept;
    Recordset& operator=(Recordset&&) noexcept;

    /// Fetches all rows of a SELECT and stands on the first. Throws StatementFailed, CannotOpen.
    void open(const QString& select);
    /// Runs the query again and stands on the first row.
    void requery();
    void close();
    bool isOpen() const;
    /// The rows live on without the connection; they can be read, moved through and filtered, but not updated.
    void disconnect();

    /// Declares a field of a table without a connection. Texts are cut to `size` characters; 0 is no limit.
    void declare(const QString& name, Kind kind, int size = 0);
    /// Opens the declared table, empty. Its pending row counts as a row.
    void openDeclared();

    bool eof() const;
    bool bof() const;
    /// Rows that the filter shows, a pending new row included.
    int recordCount() const;
    /// The number of the current row from 1, among those that the filter shows; -1 where there is none.
    int absolutePosition() const;
    void setAbsolutePosition(int position);
    void moveFirst();
    void moveNext();  // NoCurrentRow at eof
    void movePrevious();
    void moveLast();

    /// Forward from the current row to one that matches, that row itself included; `eof` where there is none, and in an
    /// empty recordset. `column='text'` or `column=number`, with = <> < <= > >= and LIKE; equality costs one index
    /// probe.
    void find(const QString& criterion);
    /// Shows only the rows that match, joined by AND where several are given; empty shows all. Stands on the first.
    void setFilter(const QString& criterion);

    /// Throw NoCurrentRow, and NoSuchColumn for a name that the query does not give.
    QVariant value(const QString& column) const;
    /// The value followed by an empty text: a Null is empty.
    QString text(const QString& column) const;
    bool isNull(const QString& column) const;
    /// Converts to the column's kind; throws TypeMismatch where that fails, and ValueTooLong for a text that a table's
    /// column does not take, so that no engine cuts it or refuses it only when other rows are written. A null QVariant
    /// sets Null.
    void set(const QString& column, const QVariant& value);

    /// Appends a row, current at once, all columns unset.
    void addNew();
    /// Writes the columns whose value differs, to the row with the same key and the old values of those columns; a row
    /// that is no longer so throws RowChanged. After an insert, identity and column defaults are read back.
    /// Without a pending change nothing happens.
    void update();
    void cancelUpdate();
    /// Deletes the current row in its base table, and stands on the next.
    void remove();

    QStringList columns() const;
    bool hasColumn(const QString& column) const;
    Kind kind(const QString& column) const;
    int size(const QString& column) const;

private:
    struct Data;
    std::unique_ptr<Data> data;
};

}  // namespace kest::db

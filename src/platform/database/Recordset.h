// Reads and changes the rows of a query, as a client-side cursor does.
#pragma once

#include "platform/database/Connection.h"

#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>

namespace kest::db {

/// The kind of a column, which determines the C++ type of its values.
enum class Kind { Text, LongText, WholeNumber, Number, Flag, Date };

/// A query fetched whole when it is opened. Columns are found without regard to case; of two columns with one name the
/// first in select order counts. Values have one C++ type for each kind on every engine: text QString, whole number
/// qint64, number double, flag bool, date QDateTime; Null is a null QVariant.
///
/// A pending change is written by `update`, by any move, find or requery, and discarded by `close`.
class Recordset {
public:
    Recordset();
    /// A null connection is accepted, but open() then throws NoObject.
    explicit Recordset(ConnectionPtr connection);
    ~Recordset();
    Recordset(Recordset&&) noexcept;
    Recordset& operator=(Recordset&&) noexcept;

    /// Fetches all rows of a SELECT. The first row becomes current. Throws StatementFailed or CannotOpen.
    void open(const QString& select);
    /// Runs the query again. The first row becomes current.
    void requery();
    /// Discards the pending change and all rows.
    void close();
    bool isOpen() const;
    /// Releases the connection. The rows can still be read, moved through and filtered, but not updated.
    void disconnect();

    /// Declares a field of a table without a connection. Texts are cut to `size` characters; 0 means no limit.
    void declare(const QString& name, Kind kind, int size = 0);
    /// Opens the declared table, which is empty. A pending row counts as a row.
    void openDeclared();

    /// Returns true after the last row, and in an empty recordset.
    bool eof() const;
    /// Returns the number of rows that the filter shows, including a pending new row.
    int recordCount() const;
    /// Returns the number of the current row, counted from 1 among the rows that the filter shows, or -1 if there is
    /// none.
    int absolutePosition() const;
    /// Makes the row with that number, counted from 1, the current row.
    void setAbsolutePosition(int position);
    void moveFirst();
    void moveNext();  // throws NoCurrentRow at eof
    void moveLast();

    /// Moves forward to the next row that matches, starting with the current row. If there is none, or if the recordset
    /// is empty, eof() becomes true. A criterion is `column='text'` or `column=number`, with = <> < <= > >= or LIKE. A
    /// search for equality uses an index.
    void find(const QString& criterion);
    /// The same for a column that equals a value, which needs no criterion. Nothing equals Null.
    void find(const QString& column, const QVariant& value);
    /// Shows only the rows that match all conditions, which are joined by AND. An empty text shows all rows. The first
    /// row becomes current.
    void setFilter(const QString& criterion);

    /// These throw NoCurrentRow, or NoSuchColumn if the query has no such column.
    QVariant value(const QString& column) const;
    /// Returns the value as text, or an empty text for a Null.
    QString text(const QString& column) const;
    bool isNull(const QString& column) const;
    /// Sets a column of the current row, converted to its kind. A null QVariant sets Null. Throws TypeMismatch if the
    /// value can't be converted. Throws ValueTooLong if a text is longer than the column, so that no engine cuts it, or
    /// refuses it only after other rows have been written.
    void set(const QString& column, const QVariant& value);

    /// Adds a row without values. It becomes current.
    void addNew();
    /// Stores the pending change, if there is one. Writes only columns whose value differs, to the row that still has
    /// the same key and the old values of those columns. Throws RowChanged if there is no such row. After an insert,
    /// reads the identity and the defaults of the columns.
    void update();
    /// Discards the pending change.
    void cancelUpdate();
    /// Deletes the current row in its base table. The next row becomes current.
    void remove();

    /// Returns the names of all columns in select order.
    QStringList columns() const;
    bool hasColumn(const QString& column) const;
    /// Returns the kind of a column. Throws NoSuchColumn.
    Kind kind(const QString& column) const;
    /// Returns the most characters of a text column, or 0 if there is no limit. Throws NoSuchColumn.
    int size(const QString& column) const;

private:
    struct Data;
    std::unique_ptr<Data> data;
};

}  // namespace kest::db

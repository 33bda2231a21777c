// Changes of rows that someone keeps a record of: the change and its record commit together, or neither does.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QStringList>
#include <QVariant>

#include <optional>

namespace kest::db {

enum class ChangeKind { Insert, Update, Delete };

/// One row that a statement changed. Null values are null QVariants.
struct RowChange {
    struct Column {
        QString name;
        Kind kind = Kind::Text;
        QVariant before;  // null in an insert
        QVariant after;   // null in a deletion
    };

    ChangeKind kind = ChangeKind::Update;
    QString table;
    QStringList key;        // the names of the columns that identify the row
    QList<Column> columns;  // the key's, those that changed and those that the observer asked for; all of a deleted row

    const Column* column(const QString& name) const;
};

/// Sees every row that a connection inserts, updates or deletes.
class ChangeObserver {
public:
    virtual ~ChangeObserver() = default;
    /// Returns false if changes of the table need no record.
    virtual bool observes(const QString& table) const = 0;
    /// Returns the columns whose values it wants to see with every change, if the row has them.
    virtual QStringList wantedColumns() const { return {}; }
    /// Called before the transaction of a change begins. If it throws, nothing is changed.
    virtual void aboutToChange() {}
    /// Called in the transaction of the change, after it. What it writes on the connection is committed with the change
    /// and is not observed itself. If it throws, the change is rolled back.
    virtual void changed(Connection& connection, const QList<RowChange>& rows) = 0;
    /// Called after the change was committed or rolled back.
    virtual void committed() {}
    virtual void takenBack() {}
};

/// Whether a change reads its row before it writes it.
enum class ChangeSteps { WriteOnly, ReadAndWrite };

/// The transaction around one change. If nothing observes the table, a change that only writes has no transaction and
/// commits alone.
class Change {
public:
    Change(Connection& connection, const QString& table, ChangeSteps steps = ChangeSteps::WriteOnly);
    /// Rolls the change back if it was not committed.
    ~Change();
    Change(const Change&) = delete;
    Change& operator=(const Change&) = delete;

    bool isObserved() const { return observer_ != nullptr; }
    QStringList wantedColumns() const { return observer_->wantedColumns(); }
    /// Shows the rows to the observer, if there is one, and commits the change.
    void commit(const QList<RowChange>& rows);

private:
    Connection& connection_;
    QString table_;
    ChangeObserver* observer_ = nullptr;
    bool isOpen_ = false;
};

/// Deletes the rows that meet a native condition. Returns their number.
qint64 deleteRows(Connection& connection, const QString& table, const QString& condition);

/// A statement of text that changes rows of one table.
struct PastedChange {
    ChangeKind kind = ChangeKind::Update;
    QString table;
    QString assignments;  // of an UPDATE, each a column and a literal
    QString condition;
};
/// Returns nothing for any other statement.
std::optional<PastedChange> pastedChange(const QString& statement);
/// Returns true if a statement of text changes rows, in a form that may be no PastedChange.
bool changesRows(const QString& statement);
/// Runs the statement. Reads the rows that it changes first, and locks them.
qint64 executeObserved(Connection& connection, const PastedChange& pasted, const QString& statement);

}  // namespace kest::db

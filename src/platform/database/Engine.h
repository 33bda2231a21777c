// What each kind of database must supply. Everything that is special about it is in its own file.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/Schema.h"

#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>
#include <vector>

namespace kest::db {

/// The result of a statement, with values in the types of the driver.
struct Answer {
    QStringList names;             // of the columns
    std::vector<QVariant> values;  // row after row
    qint64 hit = 0;                // the number of rows that the statement has changed
};

/// An open connection to a database. Statements are in the dialect of the database. Each statement commits alone, and
/// its result is read completely before the next one starts.
class Engine {
public:
    Engine() = default;
    virtual ~Engine() = default;
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    /// Returns false if the server has dropped the connection.
    bool isOpen() const { return isOpen_; }
    /// Marks the connection as lost.
    void drop() { isOpen_ = false; }

    virtual const Dialect& dialect() const = 0;

    /// Executes a statement. Throws StatementFailed, or CannotOpen if the connection is lost, with the codes of the
    /// database.
    virtual Answer run(const QString& statement) = 0;
    /// Executes an UPDATE, INSERT or DELETE and returns the number of rows that it has changed, without those of
    /// triggers.
    virtual qint64 change(const QString& statement) { return run(statement).hit; }
    /// Executes an INSERT and returns the identity of the new row.
    virtual QVariant insert(const QString& statement) = 0;

    /// Checks if the server still answers. Waits some seconds at most, even if a statement may take longer.
    virtual void ping() { run(QStringLiteral("SELECT 1")); }
    /// Sets how many seconds a statement may take. 0 means no limit.
    virtual void setTimeout(int seconds) = 0;

    /// Returns the names of all tables in the spelling of the database.
    virtual QStringList tableNames() = 0;
    /// Reads the columns and the key of a table.
    virtual std::unique_ptr<TableInfo> readTable(const QString& name) = 0;

    /// Gets a named lock. Returns false if someone else, or this connection, still has it after that time.
    virtual bool lock(const QString& name, int seconds) = 0;
    virtual void unlock(const QString& name) = 0;

    /// Rebuilds all indexes, if another program can have damaged them.
    virtual void rebuildIndexes() {}

private:
    bool isOpen_ = true;
};

/// These functions throw CannotOpen.
std::unique_ptr<Engine> openEmbedded(const QString& file);
std::unique_ptr<Engine> openMySql(const QString& host, int port, const QString& database, const QString& user,
                                  const QString& password);
std::unique_ptr<Engine> openOdbc(const QString& connectionText);

}  // namespace kest::db

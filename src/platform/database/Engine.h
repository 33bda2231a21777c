// What each kind of database must supply. Everything that is special about it is in its own file.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/Schema.h"

#include <QDeadlineTimer>
#include <QList>
#include <QScopedValueRollback>
#include <QString>
#include <QStringList>
#include <QVariant>

#include <functional>
#include <memory>
#include <utility>
#include <vector>

class QThread;

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
    /// Returns the names and versions of what lies between the component and the database, for a person to read.
    virtual QList<std::pair<QString, QString>> versions() const { return {}; }

    /// Executes a statement. Throws StatementFailed, or CannotOpen if the connection is lost, with the codes of the
    /// database.
    virtual Answer run(const QString& statement) = 0;
    /// Executes an UPDATE, INSERT or DELETE and returns the number of rows that it has changed, without those of
    /// triggers.
    virtual qint64 change(const QString& statement) { return run(statement).hit; }
    /// Executes an INSERT and returns the identity of the new row. Throws StatementFailed if no row was added.
    virtual QVariant insert(const QString& statement) = 0;

    /// Checks if the server still answers, and throws if it does not. Waits some seconds at most, even if a statement
    /// may take longer.
    virtual void ping() { run(QStringLiteral("SELECT 1")); }
    /// Sets how many seconds a statement may take. 0 means no limit.
    virtual void setTimeout(int seconds) = 0;
    /// Runs a step whose statements take no time. A server that does not answer one of them for seconds is lost.
    void shortly(const std::function<void()>& step)
    {
        const QScopedValueRollback set(isShort_, true);
        step();
    }

    /// Returns the names of all tables in the spelling of the database.
    virtual QStringList tableNames() = 0;
    /// Reads the columns and the key of a table.
    virtual std::unique_ptr<TableInfo> readTable(const QString& name) = 0;

    /// Gets a named lock. Returns false if someone else, or this connection, still has it after that time.
    virtual bool lock(const QString& name, int seconds) = 0;
    virtual void unlock(const QString& name) = 0;
    /// Ends another session if it has that lock. The embedded engine has no sessions.
    virtual void endSession(const QString& /*session*/, const QString& /*lock*/) {}

    /// Hands the connection over to a thread, which alone uses it from then on. Called in the thread that has opened
    /// it.
    virtual void moveTo(QThread* /*thread*/) {}

    /// Rebuilds all indexes, if another program can have damaged them.
    virtual void rebuildIndexes() {}

protected:
    bool isShort() const { return isShort_; }

private:
    bool isOpen_ = true;
    bool isShort_ = false;
};

/// The address of a MySQL or MariaDB server.
struct MySqlAddress {
    QString host;
    int port = 0;  // 0 means the usual one
    QString database;
    QString user;
    QString password;
};

/// How long all steps of opening a connection may take.
inline constexpr int openMilliseconds = 4500;

/// How to reach a server through an ODBC driver.
struct OdbcTarget {
    QString connectionText;
    // a server that must show first that it answers, because its driver could wait without end; may be empty
    QString host = QString();
    int port = 0;
    QDeadlineTimer deadline{openMilliseconds};  // for all steps until the first statement is answered
};

/// These functions throw CannotOpen. A server that does not answer costs less than five seconds.
std::unique_ptr<Engine> openEmbedded(const QString& file);
/// A server that is silent for longer than a statement may take counts as lost.
std::unique_ptr<Engine> openMySql(const MySqlAddress& address, int statementSeconds);
std::unique_ptr<Engine> openOdbc(const OdbcTarget& target);

}  // namespace kest::db

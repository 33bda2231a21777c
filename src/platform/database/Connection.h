// A connection to the quote database, whichever engine answers.
#pragma once

#include <QString>
#include <QVariant>

#include <memory>

namespace kest::db {

class Session;

/// One open database. Statements are written in the dialect of SQL Server; the engine that answers translates them.
/// One statement a call: a second one behind a ";" is refused with StatementFailed.
class Connection {
public:
    Connection();
    ~Connection();
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    /// Opens what a connection text of the form "Driver={...};Server=...;Database=...;Uid=...;Pwd=...;" names: MySQL
    /// and MariaDB, a driver registered with ODBC here, or, for a local server without such a driver, the embedded
    /// engine. Throws CannotOpen; a server that does not answer costs seconds.
    void open(const QString& connectionText);
    void close();
    /// 1 while the connection is open, 0 otherwise. A connection that the server has dropped is closed.
    int state() const;
    /// Asks the server whether it still answers on this connection; one that it has dropped is closed from then on.
    bool answers() const;

    /// Seconds that a statement may take; 0 is no limit.
    void setCommandTimeout(int seconds);

    /// Runs a statement that gives no rows and commits it; the number of rows that it hit.
    /// Throws StatementFailed with the engine's codes, CannotOpen when the connection has gone.
    qint64 execute(const QString& statement);

    /// Puts the indexes of the embedded database in order, which another tool may have left in another one.
    void rebuildIndexes();

    /// For the recordset.
    Session& session() const;

private:
    std::unique_ptr<Session> session_;
    int commandTimeout_ = 0;
};

using ConnectionPtr = std::shared_ptr<Connection>;

/// What only one of all that work on a database may do at a time, for as long as the lock lives. It keeps out those who
/// ask for the same name, and touches no row.
class Lock {
public:
    /// Waits that long for another one to let go.
    Lock(ConnectionPtr connection, const QString& name, int seconds = 0);
    ~Lock();
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

    bool isHeld() const { return held_; }

private:
    ConnectionPtr connection_;
    QString name_;
    bool held_ = false;
};

/// The name of the embedded database that a connection text leads to; empty where a server answers, or nothing.
QString embeddedName(const QString& connectionText);

}  // namespace kest::db

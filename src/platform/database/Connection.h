// A connection to the quote database, on any engine.
#pragma once

#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>

namespace kest::db {

class ChangeObserver;
class Session;

/// A connection to a database. Statements are written in the dialect of SQL Server and translated for other engines.
/// Each call accepts one statement; a second one after a ";" fails with StatementFailed.
class Connection {
public:
    Connection();
    ~Connection();
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    /// Opens the database in a connection text of the form "Driver={...};Server=...;Database=...;Uid=...;Pwd=...;". The
    /// driver is that of MySQL and MariaDB, or one that is registered with ODBC on this machine. For a local server
    /// without such a driver, the embedded engine is used. Throws CannotOpen; if a server does not answer, this takes
    /// some seconds.
    void open(const QString& connectionText);
    /// Closes the connection. Recordsets keep their rows. Whoever uses it afterwards gets `reason` as the description.
    void close(const QString& reason = QStringLiteral("The connection to the database is closed."));
    /// Returns 1 if the connection is open, otherwise 0. A connection that the server has dropped is closed.
    int state() const;
    /// Returns how often the connection has been opened. What belongs to a session of the server, such as a lock, ends
    /// with the next opening.
    int generation() const { return generation_; }
    /// Checks if the server still answers. If it does not, for whatever reason, the connection is closed afterwards.
    bool answers() const;

    /// Sets how many seconds a statement may take. 0 means no limit. Set before `open`, it also limits how long a
    /// silent server is waited for.
    void setCommandTimeout(int seconds);
    /// Sets fields such as "Port=1433;Encrypt=no" that the next `open` adds to the connection texts of ODBC drivers.
    void setOdbcOptions(const QString& options) { odbcOptions_ = options; }

    /// Executes and commits a statement that returns no rows. Returns the number of rows that it affects. Throws
    /// StatementFailed with the codes of the engine, or CannotOpen if the connection is lost.
    qint64 execute(const QString& statement);

    /// Rebuilds the indexes of the embedded database, which another tool may have left in another order.
    void rebuildIndexes();

    /// Returns the server's own number of this connection, or an empty text for the embedded engine.
    QString serverSession() const;
    bool hasTable(const QString& name) const;
    /// Returns those of the tables whose changes can't be taken back, because they have no transactions.
    QStringList tablesWithoutTransactions(const QStringList& tables) const;
    /// Ends another session of the server if it holds that lock.
    void endSession(const QString& serverSession, const QString& lock) const;
    /// Shows every change of a row to an observer from now on. Null ends this.
    void setObserver(std::shared_ptr<ChangeObserver> observer) { observer_ = std::move(observer); }

    /// Used by Recordset.
    Session& session() const;
    /// Returns who sees changes of the table, or null: also while a change is recorded. Used by Change.
    ChangeObserver* observerOf(const QString& table) const;
    void setInChange(bool inChange) { inChange_ = inChange; }
    /// Returns true while a change and its record are written, so that others who write must wait.
    bool isInChange() const { return inChange_; }

private:
    std::shared_ptr<ChangeObserver> observer_;
    bool inChange_ = false;
    std::unique_ptr<Session> session_;
    int generation_ = 0;
    int commandTimeout_ = 30;
    QString odbcOptions_;
    QString whyClosed_;
};

using ConnectionPtr = std::shared_ptr<Connection>;

/// A named lock shared by everyone who uses the database, held while this object lives. It locks no rows.
class Lock {
public:
    /// Tries to get the lock and waits up to this time.
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

/// Returns the name of the embedded database that a connection text opens, or an empty text if it does not open one.
QString embeddedName(const QString& connectionText);

}  // namespace kest::db

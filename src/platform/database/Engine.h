// What each kind of database supplies; its peculiarities stay in its own file.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/Schema.h"

#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>
#include <vector>

namespace kest::db {

/// All that a statement gave, in the types of the driver.
struct Answer {
    QStringList names;             // of the columns
    std::vector<QVariant> values;  // row after row
    qint64 hit = 0;                // rows that the statement changed
};

/// One open connection to a database of one kind. Statements are in its own dialect; each is read to its end before
/// the next one starts, and commits alone.
class Engine {
public:
    Engine() = default;
    virtual ~Engine() = default;
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    /// False once the server has dropped the connection.
    bool isOpen() const { return isOpen_; }
    void drop() { isOpen_ = false; }

    virtual const Dialect& dialect() const = 0;

    /// Throws StatementFailed, or CannotOpen once the connection has gone; both with the codes of the database.
    virtual Answer run(const QString& statement) = 0;
    /// The number of rows that an UPDATE, INSERT or DELETE hit, whatever triggers did besides.
    virtual qint64 change(const QString& statement) { return run(statement).hit; }
    /// The identity that an INSERT gave its row.
    virtual QVariant insert(const QString& statement) = 0;

    /// Asks the server for a sign of life. Takes seconds, not the time that a statement may take.
    virtual void ping() { run(QStringLiteral("SELECT 1")); }
    /// Seconds that a statement may take; 0 is no limit.
    virtual void setTimeout(int seconds) = 0;

    virtual QStringList tableNames() = 0;
    virtual std::unique_ptr<TableInfo> readTable(const QString& name) = 0;

    /// False if someone else, or this connection, holds the name after that time.
    virtual bool lock(const QString& name, int seconds) = 0;
    virtual void unlock(const QString& name) = 0;

    virtual void rebuildIndexes() {}

private:
    bool isOpen_ = true;
};

/// These throw CannotOpen.
std::unique_ptr<Engine> openEmbedded(const QString& file);
std::unique_ptr<Engine> openMySql(const QString& host, int port, const QString& database, const QString& user,
                                  const QString& password);
std::unique_ptr<Engine> openOdbc(const QString& connectionText);

}  // namespace kest::db

// One database engine as the connection and the recordset see it; each engine's peculiarities stay in its own file.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/database/Statement.h"

#include <QHash>
#include <QList>
#include <QSqlDatabase>
#include <QSqlError>
#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>
#include <vector>

class QSqlQuery;

namespace kest::db {

struct ResultColumn {
    QString name;
    QString table;  // the base table in the schema's spelling; empty for an expression
    Kind kind = Kind::Text;
    int size = 0;
};

/// A result fetched whole, row behind row.
struct Rows {
    QList<ResultColumn> columns;
    std::vector<QVariant> values;

    int count() const { return columns.isEmpty() ? 0 : int(values.size()) / int(columns.size()); }
};

/// What each server says in its own words in questions to INFORMATION_SCHEMA.
struct InformationSchemaTerms {
    QString ofDatabase;  // the condition for the database of the connection
    QString type;        // the declared type of a column
    QString identity;    // 1 for a column that the database numbers
};

class Engine : protected Schema {
public:
    ~Engine() override;
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    /// False once the server has dropped the connection.
    bool isOpen() const { return open_; }
    /// A statement that asks for nothing; throws where the server has dropped the connection.
    void ping() { tell(QStringLiteral("SELECT 1")); }

    // In the dialect of SQL Server:
    Rows select(const QString& statement);
    qint64 execute(const QString& statement);

    // In the engine's own dialect, as the recordset builds them:
    Rows selectNative(const QString& statement);
    qint64 executeNative(const QString& statement);
    /// Inserts the values and returns the identity that the database gave, Null where the table has none.
    QVariant insert(const TableInfo& table, const QStringList& columns, const QStringList& literals);

    /// Null for a table that the database does not have. Asked once a connection.
    const TableInfo* table(const QString& name) override;
    QString quoted(const QString& identifier) const;
    /// A value as a literal that no value can end; Null as NULL.
    virtual QString literal(const QVariant& value) const;
    /// The condition that a column still holds a value; empty for a long text that the engine can't compare.
    QString holds(const QString& column, Kind kind, const QVariant& value) const;

    virtual void setTimeout(int seconds) = 0;
    virtual void rebuildIndexes() {}

    /// False where another one holds the name after that time. An engine without such locks lets everybody in.
    virtual bool lock(const QString&, int /*seconds*/) { return true; }
    virtual void unlock(const QString&) {}

protected:
    explicit Engine(const QString& driver);

    /// Opens `database`; throws CannotOpen.
    void openDatabase();
    /// Runs a statement that the layer needs for itself; not counted by the fault of tests.
    Rows ask(const QString& statement);
    void tell(const QString& statement);
    /// A table as INFORMATION_SCHEMA tells it.
    /// The lock of MariaDB and MySQL, which is one of the server: its name holds the database's.
    bool lockOnServer(const QString& name, int seconds);
    void unlockOnServer(const QString& name);
    std::unique_ptr<TableInfo> fromInformationSchema(const QString& name, const InformationSchemaTerms& terms);

    virtual Dialect dialect() const = 0;
    virtual QStringList tableNames() = 0;
    virtual std::unique_ptr<TableInfo> readTable(const QString& name) = 0;
    virtual QString baseTable(const QSqlQuery& query, int column, const QString& reported) const;
    virtual QVariant lastIdentity(QSqlQuery& query);
    virtual QString defaultsOnly() const { return QStringLiteral("DEFAULT VALUES"); }
    /// The condition that a date column holds a literal's moment, however it was written.
    virtual QString sameDate(const QString& column, const QString& dateLiteral) const;
    /// The condition that a long text is the literal's to the letter.
    virtual QString sameLongText(const QString& /*column*/, const QString& /*literal*/) const { return {}; }
    virtual bool meansConnectionLost(const QSqlError& error) const = 0;
    virtual QString sqlState(const QSqlError& error);
    virtual void beforeStatement() {}

    QString tableSpelling(const QString& name) override;

    QSqlDatabase database;
    bool open_ = false;

private:
    void run(QSqlQuery& query, const QString& statement);
    void checkFault();
    [[noreturn]] void fail(const QSqlError& error);
    Rows fetch(QSqlQuery& query);
    QList<ResultColumn> describe(const QSqlQuery& query);
    void forgetSchema();

    QString connectionName;
    QHash<QString, QString> spellings;  // lower case to the schema's spelling
    QHash<QString, std::shared_ptr<TableInfo>> tables;
    bool spellingsKnown = false;
};

/// What a column's declared type holds.
Kind kindOfType(const QString& declaredType);
/// A value as it came from a driver in the one C++ type of its kind. A text that is no such value stays a text, so that
/// it can be read and shown, and fails where it is used as a number or a date.
QVariant normalised(const QVariant& value, Kind kind);

std::unique_ptr<Engine> openEmbedded(const QString& file);
std::unique_ptr<Engine> openMySql(const QString& host, int port, const QString& database, const QString& user,
                                  const QString& password);
std::unique_ptr<Engine> openOdbc(const QString& connectionText);

}  // namespace kest::db

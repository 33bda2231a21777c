// The engine for ODBC drivers, which uses QODBC: for SQL Server, and for others, recognised by the name that they
// return.
#include "platform/database/MySqlServer.h"
#include "platform/database/QtSqlEngine.h"

#include <QHash>
#include <QSqlDriver>
#include <QSqlError>

#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int connectSeconds = 5;

class EngineOdbc final : public QtSqlEngine {
public:
    explicit EngineOdbc(QString connectionText) : QtSqlEngine(u"QODBC"_s)
    {
        while (connectionText.endsWith(u';'))  // the driver manager would read an empty field after it, and fail
            connectionText.chop(1);
        database.setConnectOptions(u"SQL_ATTR_LOGIN_TIMEOUT=%1"_s.arg(connectSeconds));
        openNamed(connectionText);
        const QString version = run(u"SELECT @@version"_s).values.front().toString();
        if (!version.contains(u"MariaDB"_s, Qt::CaseInsensitive) &&
            database.driver()->dbmsType() != QSqlDriver::MySqlServer)
            return;
        // without this option, an update that sets the same value would count as no row
        if (!connectionText.contains(u"option="_s, Qt::CaseInsensitive)) {
            database.close();
            openNamed(connectionText + u";OPTION=2"_s);
        }
        mySql.emplace(*this);
        run(u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',PIPES_AS_CONCAT')"_s);
    }

    const Dialect& dialect() const override { return mySql ? mySqlOverOdbcDialect() : sqlServerDialect(); }

    QVariant insert(const QString& statement) override
    {
        run(statement);
        return run(u"SELECT @@IDENTITY"_s).values.front();
    }

    void setTimeout(int seconds) override
    {
        run(mySql ? mySql->timeoutStatement(seconds)
                  : u"SET LOCK_TIMEOUT "_s + QString::number(seconds > 0 ? qint64(seconds) * 1000 : -1));
    }

    QStringList tableNames() override { return tableNamesOf(*this, informationSchema()); }
    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        return tableOf(*this, informationSchema(), name);
    }

    bool lock(const QString& name, int seconds) override { return !mySql || mySql->lock(name, seconds); }
    void unlock(const QString& name) override
    {
        if (mySql)
            mySql->unlock(name);
    }

protected:
    bool meansConnectionLost(const QSqlError& error) const override
    {
        return error.databaseText().contains(u"08S01"_s) || error.databaseText().contains(u"08003"_s) ||
               MySqlServer::meansConnectionLost(codeOf(error));
    }
    QString sqlState(const QSqlError& error) const override
    {
        static const QHash<QString, QString> states{
            {u"102"_s, u"42000"_s},  {u"207"_s, u"42S22"_s},  {u"208"_s, u"42S02"_s},  {u"1205"_s, u"40001"_s},
            {u"2601"_s, u"23000"_s}, {u"2627"_s, u"23000"_s}, {u"4060"_s, u"42000"_s}, {u"18456"_s, u"28000"_s}};
        return mySql ? MySqlServer::sqlState(codeOf(error)) : states.value(codeOf(error), u"HY000"_s);
    }

private:
    static QString codeOf(const QSqlError& error) { return error.nativeErrorCode().section(u';', 0, 0); }

    void openNamed(const QString& connectionText)
    {
        database.setDatabaseName(connectionText);
        openDatabase();
    }

    const InformationSchemaTerms& informationSchema() const
    {
        static const InformationSchemaTerms ofSqlServer{
            u"TABLE_CATALOG=DB_NAME()"_s,
            u"CASE WHEN CHARACTER_MAXIMUM_LENGTH=-1 OR DATA_TYPE IN ('text', 'ntext') THEN 'longtext' "
            "ELSE DATA_TYPE END"_s,
            u"COLUMNPROPERTY(OBJECT_ID(TABLE_SCHEMA + '.' + TABLE_NAME), COLUMN_NAME, 'IsIdentity')"_s};
        return mySql ? MySqlServer::informationSchema() : ofSqlServer;
    }

    std::optional<MySqlServer> mySql;
};

}  // namespace

std::unique_ptr<Engine> openOdbc(const QString& connectionText)
{
    return std::make_unique<EngineOdbc>(connectionText);
}

}  // namespace kest::db

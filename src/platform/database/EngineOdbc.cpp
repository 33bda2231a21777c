// Whatever a registered ODBC driver reaches, through QODBC: SQL Server, and others by the name that they answer with.
#include "platform/RuntimeError.h"
#include "platform/database/Engine.h"

#include <QSqlDriver>
#include <QSqlQuery>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int connectSeconds = 5;

class EngineOdbc final : public Engine {
public:
    explicit EngineOdbc(QString connectionText) : Engine(u"QODBC"_s)
    {
        while (connectionText.endsWith(u';'))  // the driver manager takes a last one for an empty field, and fails
            connectionText.chop(1);
        database.setConnectOptions(u"SQL_ATTR_LOGIN_TIMEOUT=%1"_s.arg(connectSeconds));
        openNamed(connectionText);
        const QString version = ask(u"SELECT @@version"_s).values.front().toString();
        isMariaDb = version.contains(u"MariaDB"_s, Qt::CaseInsensitive);
        isMySql = isMariaDb || database.driver()->dbmsType() == QSqlDriver::MySqlServer;
        if (!isMySql)
            return;
        // only with this option does an update to the value already there count as a row that was hit
        if (!connectionText.contains(u"option="_s, Qt::CaseInsensitive)) {
            database.close();
            openNamed(connectionText + u";OPTION=2"_s);
        }
        tell(u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',PIPES_AS_CONCAT')"_s);
    }

    void setTimeout(int seconds) override
    {
        if (isMariaDb)
            tell(u"SET SESSION max_statement_time="_s + QString::number(seconds));
        else if (isMySql)
            tell(u"SET SESSION max_execution_time="_s + QString::number(qint64(seconds) * 1000));
        else
            tell(u"SET LOCK_TIMEOUT "_s + QString::number(seconds > 0 ? qint64(seconds) * 1000 : -1));
    }

    bool lock(const QString& name, int seconds) override { return !isMySql || lockOnServer(name, seconds); }
    void unlock(const QString& name) override
    {
        if (isMySql)
            unlockOnServer(name);
    }

protected:
    Dialect dialect() const override
    {
        Dialect dialect;
        dialect.top = dialect.plusJoinsTexts = dialect.patternSets = dialect.isoDates = !isMySql;
        dialect.caseOfTables = dialect.backslashEscapes = isMySql;
        dialect.openQuote = isMySql ? u'`' : u'[';
        dialect.closeQuote = isMySql ? u'`' : u']';
        return dialect;
    }

    QStringList tableNames() override
    {
        QStringList names;
        for (const QVariant& name :
             ask(u"SELECT TABLE_NAME FROM INFORMATION_SCHEMA.TABLES WHERE "_s + ofDatabase()).values)
            names.append(name.toString());
        return names;
    }

    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        if (isMySql)
            return fromInformationSchema(
                name, {ofDatabase(), u"CASE WHEN COLUMN_TYPE='tinyint(1)' THEN 'boolean' ELSE DATA_TYPE END"_s,
                       u"CASE WHEN EXTRA LIKE '%auto_increment%' THEN 1 ELSE 0 END"_s});
        return fromInformationSchema(
            name, {ofDatabase(),
                   u"CASE WHEN CHARACTER_MAXIMUM_LENGTH=-1 OR DATA_TYPE IN ('text', 'ntext') THEN 'longtext' "
                   "ELSE DATA_TYPE END"_s,
                   u"COLUMNPROPERTY(OBJECT_ID(TABLE_SCHEMA + '.' + TABLE_NAME), COLUMN_NAME, 'IsIdentity')"_s});
    }

    /// The driver's name of the base table is followed by a NUL and whatever stood behind it.
    QString baseTable(const QSqlQuery&, int, const QString& reported) const override
    {
        const qsizetype end = reported.indexOf(QChar(u'\0'));
        return end < 0 ? reported : reported.left(end);
    }

    QVariant lastIdentity(QSqlQuery&) override { return ask(u"SELECT @@IDENTITY"_s).values.front(); }

    QString defaultsOnly() const override { return isMySql ? u"() VALUES ()"_s : u"DEFAULT VALUES"_s; }

    bool meansConnectionLost(const QSqlError& error) const override
    {
        static const QStringList lost{u"2002"_s, u"2003"_s, u"2006"_s, u"2013"_s, u"1927"_s, u"1053"_s, u"4031"_s};
        return error.databaseText().contains(u"08S01"_s) || error.databaseText().contains(u"08003"_s) ||
               lost.contains(error.nativeErrorCode().section(u';', 0, 0));
    }

private:
    void openNamed(const QString& connectionText)
    {
        database.setDatabaseName(connectionText);
        openDatabase();
    }

    QString ofDatabase() const { return isMySql ? u"TABLE_SCHEMA=DATABASE()"_s : u"TABLE_CATALOG=DB_NAME()"_s; }

    bool isMySql = false;
    bool isMariaDb = false;
};

}  // namespace

std::unique_ptr<Engine> openOdbc(const QString& connectionText)
{
    return std::make_unique<EngineOdbc>(connectionText);
}

}  // namespace kest::db

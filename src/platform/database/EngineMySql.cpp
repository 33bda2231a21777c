// MariaDB and MySQL, reached directly through QMYSQL.
#include "platform/RuntimeError.h"
#include "platform/database/Engine.h"

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int connectSeconds = 5;

class EngineMySql final : public Engine {
public:
    EngineMySql(const QString& host, int port, const QString& databaseName, const QString& user,
                const QString& password)
        : Engine(u"QMYSQL"_s)
    {
        // "localhost" would be answered by a local socket, whatever the port
        database.setHostName(host.compare(u"localhost"_s, Qt::CaseInsensitive) == 0 && port > 0 ? u"127.0.0.1"_s
                                                                                                : host);
        if (port > 0)
            database.setPort(port);
        database.setDatabaseName(databaseName);
        database.setUserName(user);
        database.setPassword(password);
        database.setConnectOptions(u"CLIENT_FOUND_ROWS=1;MYSQL_OPT_CONNECT_TIMEOUT=%1"_s.arg(connectSeconds));
        openDatabase();
        // strict: a value that does not fit is refused and not cut, however the server is set
        tell(
            u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',NO_BACKSLASH_ESCAPES,PIPES_AS_CONCAT,STRICT_ALL_TABLES'), "
            "autocommit=1"_s);
        isMariaDb = ask(u"SELECT VERSION()"_s).values.front().toString().contains(u"MariaDB"_s, Qt::CaseInsensitive);
    }

    void setTimeout(int seconds) override
    {
        tell(isMariaDb ? u"SET SESSION max_statement_time="_s + QString::number(seconds)
                       : u"SET SESSION max_execution_time="_s + QString::number(qint64(seconds) * 1000));
    }

    bool lock(const QString& name, int seconds) override { return lockOnServer(name, seconds); }
    void unlock(const QString& name) override { unlockOnServer(name); }

protected:
    Dialect dialect() const override
    {
        Dialect dialect;
        dialect.caseOfTables = true;
        dialect.openQuote = dialect.closeQuote = u'`';
        return dialect;
    }

    QStringList tableNames() override
    {
        QStringList names;
        for (const QVariant& name :
             ask(u"SELECT TABLE_NAME FROM INFORMATION_SCHEMA.TABLES WHERE TABLE_SCHEMA=DATABASE()"_s).values)
            names.append(name.toString());
        return names;
    }

    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        return fromInformationSchema(name, {u"TABLE_SCHEMA=DATABASE()"_s,
                                            u"CASE WHEN COLUMN_TYPE='tinyint(1)' THEN 'boolean' ELSE DATA_TYPE END"_s,
                                            u"CASE WHEN EXTRA LIKE '%auto_increment%' THEN 1 ELSE 0 END"_s});
    }

    QString defaultsOnly() const override { return u"() VALUES ()"_s; }

    QString sameLongText(const QString& column, const QString& literal) const override
    {
        return u"CONVERT(%1 USING utf8mb4)=%2 COLLATE utf8mb4_bin"_s.arg(column, literal);
    }

    bool meansConnectionLost(const QSqlError& error) const override
    {
        static const QStringList lost{u"2002"_s, u"2003"_s, u"2006"_s, u"2013"_s,
                                      u"2055"_s, u"1927"_s, u"1053"_s, u"4031"_s};
        return lost.contains(error.nativeErrorCode());
    }

private:
    bool isMariaDb = false;
};

}  // namespace

std::unique_ptr<Engine> openMySql(const QString& host, int port, const QString& database, const QString& user,
                                  const QString& password)
{
    return std::make_unique<EngineMySql>(host, port, database, user, password);
}

}  // namespace kest::db

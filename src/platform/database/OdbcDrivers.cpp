#include "platform/database/OdbcDrivers.h"

#include "platform/RuntimeError.h"
#include "platform/database/TdsServer.h"

#include <QDir>
#include <QFile>

#include <optional>
#include <utility>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int defaultPort = 1433;
constexpr int connectSeconds = openMilliseconds / 1000;
constexpr int networkSeconds = 125;  // a little more than the longest statement
constexpr int instanceMilliseconds = 900;

enum class Family { FreeTds, Microsoft, MySql, Other };

/// Returns the library of a driver, or nothing if no list of drivers has a section with its name.
std::optional<QString> libraryOf(const QString& driver)
{
    const QString folder = qEnvironmentVariable("ODBCSYSINI", u"/etc"_s);
    QString systemList = qEnvironmentVariable("ODBCINSTINI", u"odbcinst.ini"_s);
    if (QDir::isRelativePath(systemList))
        systemList = folder + u'/' + systemList;
    for (const QString& path : {systemList, QDir::homePath() + u"/.odbcinst.ini"_s}) {
        QFile list(path);
        if (!list.open(QIODevice::ReadOnly))
            continue;
        std::optional<QString> library;
        for (const QByteArray& bytes : list.readAll().split('\n')) {
            const QString line = QString::fromUtf8(bytes).trimmed();
            if (line.startsWith(u'[') && library)
                break;
            if (line.startsWith(u'[') && line.endsWith(u']') &&
                line.sliced(1, line.size() - 2).trimmed().compare(driver, Qt::CaseInsensitive) == 0)
                library = QString();
            else if (library && line.section(u'=', 0, 0).trimmed().compare(u"Driver"_s, Qt::CaseInsensitive) == 0)
                library = line.section(u'=', 1).trimmed();
        }
        if (library)
            return library;
    }
    return std::nullopt;
}

Family familyOf(const QString& driver)
{
    const QString library = libraryOf(driver).value_or(QString()).section(u'/', -1);
    const auto has = [&](QLatin1StringView word) { return library.contains(word, Qt::CaseInsensitive); };
    if (has("tdsodbc"_L1))
        return Family::FreeTds;
    if (has("msodbcsql"_L1))
        return Family::Microsoft;
    return has("maodbc"_L1) || has("myodbc"_L1) ? Family::MySql : Family::Other;
}

struct Server {
    QString host;
    int port = 0;
};

/// Reads "host\instance", "host,port\" and "(local)\".
Server serverOf(const ConnectionText& text)
{
    const QString name = text.value(u"Server");
    const int givenPort = text.value(u"Port").toInt();
    const QString host = name.section(u'\\', 0, 0).section(u',', 0, 0).trimmed();
    const QString instance = name.section(u'\\', 1).trimmed();
    const QString portText = name.section(u'\\', 0, 0).section(u',', 1).trimmed();
    const bool isHere = host.isEmpty() || host == u"."_s || host.compare(u"(local)"_s, Qt::CaseInsensitive) == 0;
    Server server{isHere ? u"127.0.0.1"_s : host, givenPort > 0 ? givenPort : portText.toInt()};
    if (server.port == 0)
        server.port = instance.isEmpty() ? defaultPort : portOfInstance(server.host, instance, instanceMilliseconds);
    if (server.port == 0)
        throw RuntimeError(CannotOpen,
                           u"The server %1 does not tell the port of its instance %2; name the port in "
                           "OdbcOptions."_s.arg(server.host, instance))
            .withDatabaseCodes(u"0"_s, u"08001"_s);
    return server;
}

}  // namespace

bool isRegistered(const QString& driver)
{
    return libraryOf(driver).has_value();
}

QString sqlServerDriver()
{
    for (const QString& driver :
         {u"SQL Server"_s, u"ODBC Driver 18 for SQL Server"_s, u"ODBC Driver 17 for SQL Server"_s, u"FreeTDS"_s}) {
        if (isRegistered(driver))
            return driver;
    }
    return {};
}

OdbcTarget odbcTarget(const ConnectionText& given, const QString& driver, const ConnectionText& options)
{
    const QDeadlineTimer deadline(openMilliseconds);
    ConnectionText text = given;
    text.set(u"Driver"_s, u'{' + driver + u'}');
    text.add(options);
    switch (familyOf(driver)) {
        case Family::FreeTds: {
            const Server server = serverOf(text);
            text.set(u"Server"_s, server.host);
            text.set(u"Port"_s, QString::number(server.port));
            return {text.text(), server.host, server.port, deadline};
        }
        case Family::Microsoft: {
            const Server server = serverOf(text);
            text.remove(u"Port");
            text.set(u"Server"_s, u"%1,%2"_s.arg(server.host).arg(server.port));
            return {text.text(), {}, 0, deadline};
        }
        case Family::MySql:
            // without this option, an update that sets the same value would count as no row
            if (!text.has(u"Option"))
                text.set(u"OPTION"_s, u"2"_s);
            for (const auto& [name, seconds] : {std::pair(u"CONN_TIMEOUT"_s, connectSeconds),
                                                {u"READ_TIMEOUT"_s, networkSeconds},
                                                {u"WRITE_TIMEOUT"_s, networkSeconds}})
                text.set(name, QString::number(seconds));
            return {text.text()};
        case Family::Other:
            break;
    }
    return {text.text()};
}

}  // namespace kest::db

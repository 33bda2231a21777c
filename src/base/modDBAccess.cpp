#include "base/modDBAccess.h"

#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modLoggerEx.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Engine.h"
#include "platform/database/Session.h"
#include "platform/settings/registry.h"
#include "platform/values.h"

#include <QDeadlineTimer>
#include <QElapsedTimer>
#include <QSysInfo>

#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

db::ConnectionPtr gcnDB;
QString gsSAPwd;
QString gsDatabase;
QString gsServer;
QString gsInstance;

namespace {

constexpr int longestCommand = 120;         // seconds
constexpr qint64 slowMilliseconds = 1000;   // an attempt that takes longer to fail has met a silent server
constexpr qint64 pauseMilliseconds = 5000;  // before a silent server is tried again
constexpr auto mysqlServer = "mysql:"_L1;

std::optional<RuntimeError> lastFailure;  // from the last attempt to open the connection
QString versions;                         // of driver and server, as the last connection that was opened knows them
std::function<void()> afterOpening;
QDeadlineTimer silence;  // until then, a silent server is not tried again

QString splashSetting(const QString& key, const QString& fallback = {})
{
    return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, key, fallback, CopyUp::No);
}

/// Returns the time limit of a statement in seconds. A setting can only lower it.
int commandTimeout()
{
    double seconds = 0;
    attempt([&] { seconds = toDouble(splashSetting(u"CommandTimeout"_s)); });
    return seconds >= 1 && seconds < longestCommand ? int(seconds) : longestCommand;
}

QString odbcOptions()
{
    const QString prefix = splashSetting(u"TabletUseMaster"_s) == u"1"_s ? u"TabletMaster"_s : QString();
    return qEnvironmentVariable("KEST2_ODBC_OPTIONS", splashSetting(prefix + u"OdbcOptions"_s));
}

void open(db::Connection& connection, int driverNumber)
{
    connection.setCommandTimeout(commandTimeout());
    connection.setOdbcOptions(odbcOptions());
    connection.open(connectionText(driverNumber));
}

}  // namespace

void readConnectionSettings()
{
    const QString useMaster = splashSetting(u"TabletUseMaster"_s);
    const QString prefix = useMaster == u"1"_s ? u"TabletMaster"_s : QString();
    gsSAPwd = splashSetting(prefix + u"SAPwd"_s);
    gsDatabase = splashSetting(prefix + u"DatabaseName"_s, u"WirSql"_s);
    gsInstance = splashSetting(prefix + u"InstanceName"_s);
    gsServer = splashSetting(prefix + u"ServerName"_s, u"(local)"_s);
    gbTabletLocal = useMaster == u"0"_s;

    if (gsServer == GetComputerName())
        gsServer = u"(local)"_s;
}

int driverNumber(CopyUp copyUp)
{
    const QString type = GetRegSetting(u"wirra32"_s, u"frmSplash"_s, u"ClientConnectionType"_s, u"0"_s, copyUp);
    const QString system =
        GetRegSetting(u"Microsoft"_s, u"Windows NT\\CurrentVersion"_s, u"CurrentVersion"_s, QString(), copyUp);
    if (system >= u"6.0"_s)
        return 1;
    int number = 0;  // stays 0 if the text is not a number
    attempt([&] { number = static_cast<int>(toInteger(type)); });
    return number;
}

namespace {

bool isOpen()
{
    return gcnDB && gcnDB->answers();
}

}  // namespace

db::ConnectionPtr GetConnection()
{
    return EnsureConnection() ? gcnDB : nullptr;
}

bool EnsureConnection()
{
    if (isOpen())
        return true;
    if (gcnDB && !silence.hasExpired())
        return false;  // otherwise each of several steps would wait for the same server
    OpenDatabase();
    gConn = gcnDB;
    if (isOpen() && afterOpening)
        attempt(afterOpening);
    return isOpen();
}

void setAfterOpening(std::function<void()> step)
{
    afterOpening = std::move(step);
}

void OpenDatabase()
{
    if (!gcnDB)
        gcnDB = std::make_shared<db::Connection>();  // keep an existing one: recordsets, such as the panel's, use it
    const QString failureBefore = connectionFailure();
    lastFailure.reset();
    QElapsedTimer time;
    time.start();
    attempt([&] {
        try {
            readConnectionSettings();
            settings::check();  // a damaged file must not open the database of the default settings
            gcnDB->close();
            journal::unwatch();
            open(*gcnDB, driverNumber());
            versions.clear();
            db::Engine& engine = gcnDB->session().engine();
            for (const auto& [name, version] : engine.versions())
                versions += u", "_s + name + u' ' + version;
            engine.shortly([] { journal::watch(gcnDB); });
        } catch (const RuntimeError& error) {
            gcnDB->close(error.description());  // also if only the journal did not answer: work without it could not be
                                                // taken back
            lastFailure = error;
            if (error.description() != failureBefore)  // only once, because each event of an open window tries again
                logFailure(error, u"modDBAccess.OpenDatabase"_s);
        }
    });
    silence = QDeadlineTimer(lastFailure && time.hasExpired(slowMilliseconds) ? pauseMilliseconds : 0);
}

QString connectionFailure()
{
    return lastFailure ? lastFailure->description() : QString();
}

QString connectionText(int driverNumber)
{
    if (gsServer.startsWith(mysqlServer, Qt::CaseInsensitive)) {
        const QStringList address = gsServer.mid(mysqlServer.size()).split(u':');
        return u"Driver={MySQL};Server="_s + address.value(0) + u";Port="_s + address.value(1, u"3306"_s) +
               u";Database="_s + gsDatabase + u";Uid=sa;Pwd="_s + gsSAPwd + u';';
    }
    const QString server = gsServer.endsWith(u'\\') ? gsServer : gsServer + u'\\';
    const QString tail =
        u"Server="_s + server + gsInstance + u";Database="_s + gsDatabase + u";Uid=sa;Pwd="_s + gsSAPwd + u';';
    switch (driverNumber) {
        case 0:
            return u"Driver={SQL Server};"_s + tail;
        case 1:
            return u"Driver={SQL Native Client};"_s + tail;
        default:
            return {};
    }
}

bool usesEmbeddedDatabase()
{
    readConnectionSettings();
    return !db::embeddedName(connectionText(driverNumber(CopyUp::No))).isEmpty();
}

QString databaseDescription()
{
    const QString embedded = db::embeddedName(connectionText(driverNumber(CopyUp::No)));
    const QString server = (gsServer + u' ' + gsInstance).trimmed();
    return (embedded.isEmpty() ? gsDatabase + u" on "_s + server : embedded + u" (embedded)"_s) + versions;
}

std::optional<db::Recordset> OpenRecordset(const QString& select, bool disconnect, bool reconnect)
{
    if (reconnect)
        gcnDB.reset();
    if (!EnsureConnection()) {
        desktop::msgBox(QString::number(lastFailure ? lastFailure->number() : 0) +
                            u": Could not Initialize Database! - "_s + connectionFailure(),
                        desktop::Icon::Critical);
        return std::nullopt;
    }
    db::Recordset rows(gcnDB);
    rows.open(select);
    if (disconnect)
        rows.disconnect();
    return rows;
}

db::ConnectionPtr anotherConnection()
{
    auto connection = std::make_shared<db::Connection>();
    open(*connection, driverNumber(CopyUp::No));
    return connection;
}

db::Recordset opened(const QString& select)
{
    db::Recordset rows(gConn);
    rows.open(select);
    return rows;
}

QString cutFor(const db::Recordset& row, const QString& column, const QString& text)
{
    const int size = row.size(column);
    return size > 0 ? text.left(size) : text;
}

QString GetComputerName()
{
    return QSysInfo::machineHostName();
}

}  // namespace kest

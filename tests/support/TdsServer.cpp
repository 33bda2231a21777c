#include "support/TdsServer.h"

#include "platform/database/Connection.h"
#include "setup/QuoteDatabase.h"
#include "support/OdbcDrivers.h"
#include "support/Test.h"

#include <sys/prctl.h>

#include <csignal>

namespace kest::test {

static std::unique_ptr<TdsServer> shared;

constexpr int startMilliseconds = 30000;
constexpr int stopMilliseconds = 10000;

TdsServer::TdsServer() : folder_(memoryFolder(u"tds"_s))
{
    QStringList arguments{u"-B"_s,       checkoutFile(u"tests/support/tds/standin.py"_s),
                          u"--folder"_s, folder_.path(),
                          u"--login"_s,  user() + u':'};
    if (const QString statements = qEnvironmentVariable("KEST2_TDS_STATEMENTS"); !statements.isEmpty())
        arguments << u"--statements"_s << statements;
    server_.setProcessChannelMode(QProcess::MergedChannels);
    server_.setChildProcessModifier([] { prctl(PR_SET_PDEATHSIG, SIGKILL); });
    server_.start(u"/usr/bin/python3"_s, arguments);  // not another Python, which would not find Debian's packages
    const QDeadlineTimer deadline(startMilliseconds);
    while (!server_.canReadLine()) {
        if (deadline.hasExpired() || server_.state() == QProcess::NotRunning)
            throw std::runtime_error("standin.py: " + server_.readAll().toStdString());
        server_.waitForReadyRead(100);
    }
    const QString line = QString::fromUtf8(server_.readLine()).trimmed();
    if (!line.startsWith(u"ready "_s))
        throw std::runtime_error("standin.py: " + line.toStdString() + server_.readAll().toStdString());
    address_ = line.section(u' ', 1);
}

TdsServer::~TdsServer()
{
    server_.closeWriteChannel();
    if (!server_.waitForFinished(stopMilliseconds))
        server_.kill();
}

void TdsServer::createDatabase(const QString& name, const QString& script)
{
    db::Connection connection;
    connection.open(connectionText(u"master"_s));
    connection.execute(u"CREATE DATABASE "_s + name);
    connection.open(connectionText(name));
    for (const QString& statement : app::statementsIn(script))
        connection.execute(statement);
}

QString TdsServer::connectionText(const QString& database) const
{
    return u"Driver={%1};Server=%2;Port=1433;Database=%3;Uid=%4;Pwd=;App=test;"_s.arg(QLatin1StringView(odbcTds),
                                                                                      address_, database, user());
}

QString TdsServer::schemaOf(QString mariaDbScript)
{
    const std::pair<QString, QString> words[] = {
        {u"INTEGER NOT NULL AUTO_INCREMENT"_s, u"INT IDENTITY(1,1) NOT NULL"_s},
        {u"INTEGER"_s, u"INT"_s},
        {u"DOUBLE"_s, u"FLOAT"_s},
        {u"BOOLEAN"_s, u"BIT"_s},
        {u"LONGTEXT"_s, u"TEXT"_s}};
    for (const auto& [theirs, ours] : words)
        mariaDbScript.replace(theirs, ours);
    return mariaDbScript.remove(QRegularExpression(u" DEFAULT CHARACTER SET [^;]*"_s));
}

TdsServer& tdsServer()
{
    if (!shared)
        shared = std::make_unique<TdsServer>();
    return *shared;
}

void stopTdsServer()
{
    shared.reset();
}

}  // namespace kest::test

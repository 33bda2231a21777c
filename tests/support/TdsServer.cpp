#include "support/TdsServer.h"

#include "support/OdbcDrivers.h"
#include "support/Test.h"

namespace kest::test {

TdsServer::TdsServer() : TestServer(u"tds"_s, u"master"_s, u"CREATE DATABASE %1"_s)
{
    QStringList arguments{u"-B"_s,       checkoutFile(u"tests/support/tds/standin.py"_s),
                          u"--folder"_s, folder_.path(),
                          u"--login"_s,  u"sa:"_s};
    if (const QString statements = qEnvironmentVariable("KEST2_TDS_STATEMENTS"); !statements.isEmpty())
        arguments << u"--statements"_s << statements;
    // not another Python, which would not find Debian's packages
    start(u"/usr/bin/python3"_s, arguments, [this] { return server_.canReadLine(); });
    const QString line = QString::fromUtf8(server_.readLine()).trimmed();
    if (!line.startsWith(u"ready "_s))
        throw std::runtime_error("standin.py: " + line.toStdString() + server_.readAll().toStdString());
    address_ = line.section(u' ', 1);
}

QString TdsServer::connectionText(const QString& database) const
{
    return u"Driver={%1};Server=%2;Port=1433;Database=%3;Uid=sa;Pwd=;App=test;"_s.arg(QLatin1StringView(odbcTds),
                                                                                      address_, database);
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

}  // namespace kest::test

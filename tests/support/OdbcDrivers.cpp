#include "support/OdbcDrivers.h"

#include "support/Test.h"

namespace kest::test {

static QString libraryOf(const QString& name)
{
    QDir::setSearchPaths(u"odbc"_s, {u"/usr/lib/x86_64-linux-gnu/odbc"_s, u"/usr/lib/aarch64-linux-gnu/odbc"_s});
    return QFileInfo(u"odbc:"_s + name).absoluteFilePath();
}

OdbcDrivers::OdbcDrivers(Names names)
{
    const QString tds = libraryOf(u"libtdsodbc.so"_s);
    QString list = u"[%1]\nDriver=%2\n[%3]\nDriver=%4\n"_s.arg(
        QLatin1StringView(odbcMariaDb), libraryOf(u"libmaodbc.so"_s), QLatin1StringView(odbcTds), tds);
    if (names == WithSqlServer)
        list += u"[SQL Server]\nDriver=%1\n"_s.arg(tds);
    QFile file(folder_.filePath(u"odbcinst.ini"_s));
    if (!file.open(QIODevice::WriteOnly) || file.write(list.toUtf8()) < 0)
        throw std::runtime_error("odbcinst.ini can't be written");
    qputenv("ODBCSYSINI", QFile::encodeName(folder_.path()));
}

OdbcDrivers::~OdbcDrivers()
{
    if (before_.isNull())
        qunsetenv("ODBCSYSINI");
    else
        qputenv("ODBCSYSINI", before_);
}

}  // namespace kest::test

#include "support/OdbcDrivers.h"

#include "support/Test.h"

namespace kest::test {

static QString libraryOf(const QString& name)
{
    QString found;
    for (const QString& place : {u"x86_64-linux-gnu/odbc"_s, u"aarch64-linux-gnu/odbc"_s, u"odbc"_s}) {
        const QString candidate = u"/usr/lib/%1/%2"_s.arg(place, name);
        if (QFile::exists(candidate))
            found = candidate;
    }
    return found;
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

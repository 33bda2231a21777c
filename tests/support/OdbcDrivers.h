// Replaces the ODBC drivers of this machine for a test program and its child processes.
#pragma once

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <stdexcept>

namespace kest::test {

constexpr auto odbcMariaDb = "Shop Server";
constexpr auto odbcTds = "TDS Server";

/// Lists the drivers for ODBC as long as it lives.
class OdbcDrivers {
public:
    /// `WithSqlServer` also registers the driver for the simulated server under the name that shops use.
    enum Names { Own, WithSqlServer };
    explicit OdbcDrivers(Names names) : OdbcDrivers(listOf(names)) {}
    /// Lists the drivers as a file odbcinst.ini does.
    explicit OdbcDrivers(const QByteArray& list)
    {
        QFile file(folder_.filePath(QStringLiteral("odbcinst.ini")));
        if (!file.open(QIODevice::WriteOnly) || file.write(list) < 0)
            throw std::runtime_error("odbcinst.ini can't be written");
        qputenv("ODBCSYSINI", QFile::encodeName(folder_.path()));
    }
    /// Restores the drivers of the machine.
    ~OdbcDrivers() { before_.isNull() ? qunsetenv("ODBCSYSINI") : qputenv("ODBCSYSINI", before_); }
    Q_DISABLE_COPY_MOVE(OdbcDrivers)

private:
    static QByteArray listOf(Names names)
    {
        const QByteArray tds = "]\nDriver=" + library("libtdsodbc.so");
        return QByteArray("[") + odbcTds + tds + "[" + odbcMariaDb + "]\nDriver=" + library("libmaodbc.so") +
               (names == WithSqlServer ? "[SQL Server" + tds : QByteArray());
    }
    /// Returns the path of a library and a line end.
    static QByteArray library(const char* name)
    {
        QDir::setSearchPaths(QStringLiteral("odbc"), {QStringLiteral("/usr/lib/x86_64-linux-gnu/odbc"),
                                                      QStringLiteral("/usr/lib/aarch64-linux-gnu/odbc")});
        return QFile::encodeName(QFileInfo(QStringLiteral("odbc:") + QLatin1StringView(name)).absoluteFilePath()) +
               '\n';
    }

    QTemporaryDir folder_;
    QByteArray before_ = qgetenv("ODBCSYSINI");
};

}  // namespace kest::test

// Replaces the ODBC drivers of this machine for a test program and its child processes.
#pragma once

#include <QByteArray>
#include <QTemporaryDir>

namespace kest::test {

constexpr auto odbcMariaDb = "Shop Server";
constexpr auto odbcTds = "TDS Server";

/// Lists the drivers for ODBC as long as it lives.
class OdbcDrivers {
public:
    /// `WithSqlServer` also registers the driver for the simulated server under the name that shops use.
    enum Names { Own, WithSqlServer };
    explicit OdbcDrivers(Names names);
    /// Restores the drivers of the machine.
    ~OdbcDrivers();
    Q_DISABLE_COPY_MOVE(OdbcDrivers)

private:
    QTemporaryDir folder_;
    QByteArray before_ = qgetenv("ODBCSYSINI");
};

}  // namespace kest::test

// The ODBC drivers that a test program and its children see, whatever this machine has.
#pragma once

#include <QByteArray>
#include <QTemporaryDir>

namespace kest::test {

constexpr auto odbcMariaDb = "Shop Server";
constexpr auto odbcTds = "TDS Server";

class OdbcDrivers {
public:
    /// `WithSqlServer` also registers the driver for the stand-in under the name that shops know.
    enum Names { Own, WithSqlServer };
    explicit OdbcDrivers(Names names);
    /// Those that were registered before.
    ~OdbcDrivers();
    Q_DISABLE_COPY_MOVE(OdbcDrivers)

private:
    QTemporaryDir folder_;
    QByteArray before_ = qgetenv("ODBCSYSINI");
};

}  // namespace kest::test

// A stand-in for SQL Server for tests, spoken to through FreeTDS; tds/standin.py says what it is and what it is not.
#pragma once

#include <QProcess>
#include <QString>
#include <QTemporaryDir>

namespace kest::test {

class TdsServer {
public:
    /// Started and ready; throws std::runtime_error with its own words if it does not come up.
    TdsServer();
    /// Stopped. It ends with the test program too, however that ends.
    ~TdsServer();

    /// An address of this machine that nobody else has. The port is SQL Server's usual one, so the address is all that
    /// a client needs to know.
    QString address() const { return address_; }
    /// The instance that the browser service on that address knows.
    static QString instance() { return QStringLiteral("SHOP"); }
    static QString user() { return QStringLiteral("sa"); }

    /// Makes an empty database, in place of one of that name, and runs the statements of a script in it.
    void createDatabase(const QString& name, const QString& script = {});
    QString connectionText(const QString& database) const;

private:
    QTemporaryDir folder_;
    QProcess server_;
    QString address_;
};

/// The one stand-in of a test program, started when it is first asked for.
TdsServer& tdsServer();
/// Before the program ends.
void stopTdsServer();

}  // namespace kest::test

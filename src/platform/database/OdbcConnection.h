// A client of the ODBC driver manager that reads the complete result of each statement.
#pragma once

#include "platform/database/DriverSocket.h"
#include "platform/database/Engine.h"

#include <QList>
#include <QString>

#include <memory>
#include <utility>

namespace kest::db {

/// A message of a driver.
struct OdbcMessage {
    QString state;  // SQLSTATE
    int native = 0;
    QString text;
};

/// Thrown if a call fails. Contains what the driver says about it.
struct OdbcFailure {
    QList<OdbcMessage> messages;
    bool connectionIsDead = false;  // as the driver says
};

/// A connection through ODBC's own calls, which lasts as long as the object.
class OdbcConnection {
public:
    /// Opens the connection. Throws OdbcFailure, after `seconds` at most if the driver observes that limit.
    OdbcConnection(const QString& connectionText, int seconds);
    ~OdbcConnection();
    OdbcConnection(const OdbcConnection&) = delete;
    OdbcConnection& operator=(const OdbcConnection&) = delete;

    /// Executes a statement or a batch and reads all its results. Returns the rows of the last result that has columns,
    /// and the number of changed rows of the last one that has none. 0 seconds means no limit. Throws OdbcFailure.
    Answer run(const QString& statement, int seconds);

    const DriverSocket& socket() const { return socket_; }

    /// Returns the name of the database's product.
    QString databaseName() const;
    /// Returns the names and versions of the driver, the driver manager and the server.
    QList<std::pair<QString, QString>> versions() const;

private:
    QString information(unsigned short item) const;

    DriverSocket socket_;
    struct Handles;
    std::unique_ptr<Handles> handles;
};

}  // namespace kest::db

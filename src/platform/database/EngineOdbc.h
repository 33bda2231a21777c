// What the engines that use an ODBC driver have in common.
#pragma once

#include "platform/database/Engine.h"
#include "platform/database/OdbcConnection.h"

#include <memory>

namespace kest::db {

/// An engine that uses an OdbcConnection.
class EngineOdbc : public Engine {
public:
    QList<std::pair<QString, QString>> versions() const override { return connection_->versions(); }
    Answer run(const QString& statement) override
    {
        return isShort() ? runShortly(statement) : run(statement, statementSeconds());
    }
    void ping() override;

protected:
    explicit EngineOdbc(std::unique_ptr<OdbcConnection> connection) : connection_(std::move(connection)) {}

    Answer run(const QString& statement, int seconds);
    const DriverSocket& socket() const { return connection_->socket(); }
    /// Executes a statement that takes no time. A server that does not answer for seconds is lost.
    virtual Answer runShortly(const QString& statement);
    /// Returns the time limit that the driver must observe, or 0 if the server does so itself.
    virtual int statementSeconds() const = 0;
    /// Returns true if the message says that the connection is lost.
    virtual bool meansConnectionLost(const OdbcMessage& message) const = 0;
    /// Returns the SQLSTATE of a message.
    virtual QString sqlState(const OdbcMessage& message) const = 0;

private:
    [[noreturn]] void fail(const OdbcFailure& failure);

    std::unique_ptr<OdbcConnection> connection_;
};

std::unique_ptr<Engine> sqlServerOverOdbc(std::unique_ptr<OdbcConnection> connection);
std::unique_ptr<Engine> mySqlOverOdbc(std::unique_ptr<OdbcConnection> connection);

}  // namespace kest::db

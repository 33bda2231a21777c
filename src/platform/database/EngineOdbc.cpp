#include "platform/database/EngineOdbc.h"

#include "platform/RuntimeError.h"
#include "platform/Waiting.h"
#include "platform/database/OdbcDrivers.h"
#include "platform/database/TdsServer.h"

#include <QRegularExpression>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int loginMilliseconds = 1000;  // at least this is left for the login of the driver, which counts seconds
// A silent server costs twice that, because a driver also waits for the answer to its cancellation.
constexpr int answerSeconds = 2;

/// Returns the message that says what failed: the first that is more than a warning.
OdbcMessage decisive(const QList<OdbcMessage>& messages)
{
    const auto found = std::find_if(messages.begin(), messages.end(),
                                    [](const OdbcMessage& message) { return !message.state.startsWith(u"01"_s); });
    if (found != messages.end())
        return *found;
    return messages.isEmpty() ? OdbcMessage{u"HY000"_s, 0, u"The driver gives no reason."_s} : messages.first();
}

/// Returns a message without the names of those who passed it on: "[driver][server]".
QString plain(QString message)
{
    static const QRegularExpression senders(u"\\A(\\[[^\\]]*\\])+"_s);
    return message.remove(senders).trimmed();
}

}  // namespace

void EngineOdbc::ping()
{
    patiently(u"Waiting for the database..."_s, [&] { runShortly(u"SELECT 1"_s); });
}

Answer EngineOdbc::runShortly(const QString& statement)
{
    return run(statement, answerSeconds);
}

Answer EngineOdbc::run(const QString& statement, int seconds)
{
    if (!isOpen())
        throw RuntimeError(CannotOpen, u"The connection to the database is lost."_s);
    try {
        return connection_->run(statement, seconds);
    } catch (const OdbcFailure& failure) {
        fail(failure);
    }
}

void EngineOdbc::fail(const OdbcFailure& failure)
{
    const bool lost = failure.connectionIsDead ||
                      std::any_of(failure.messages.begin(), failure.messages.end(), [&](const OdbcMessage& message) {
                          return message.state.startsWith(u"08"_s) || meansConnectionLost(message);
                      });
    if (lost)
        drop();
    const OdbcMessage message = decisive(failure.messages);
    throw RuntimeError(lost ? CannotOpen : StatementFailed, plain(message.text))
        .withDatabaseCodes(QString::number(message.native), sqlState(message));
}

std::unique_ptr<Engine> openOdbc(const OdbcTarget& target)
{
    const int helloMilliseconds = int(target.deadline.remainingTime()) - loginMilliseconds;
    if (!target.host.isEmpty() && !answersHello(target.host, target.port, helloMilliseconds))
        throw RuntimeError(CannotOpen, u"The server %1 does not answer on port %2."_s.arg(target.host).arg(target.port))
            .withDatabaseCodes(u"0"_s, u"08001"_s);
    const int loginSeconds = int(std::max<qint64>(target.deadline.remainingTime(), loginMilliseconds) / 1000);
    try {
        auto connection = std::make_unique<OdbcConnection>(target.connectionText, loginSeconds);
        const QString name = connection->databaseName();
        if (name.contains(u"MySQL"_s, Qt::CaseInsensitive) || name.contains(u"MariaDB"_s, Qt::CaseInsensitive))
            return mySqlOverOdbc(std::move(connection));
        return sqlServerOverOdbc(std::move(connection));
    } catch (const OdbcFailure& failure) {
        const OdbcMessage message = decisive(failure.messages);
        throw RuntimeError(CannotOpen, plain(message.text))
            .withDatabaseCodes(QString::number(message.native), message.state);
    }
}

}  // namespace kest::db

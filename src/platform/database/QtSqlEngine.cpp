#include "platform/database/QtSqlEngine.h"

#include "platform/RuntimeError.h"

#include <QSqlDriver>
#include <QSqlError>
#include <QSqlQuery>
#include <QSqlRecord>

#include <atomic>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

QString nextConnectionName()
{
    static std::atomic<int> last{0};
    return u"kest2-"_s + QString::number(++last);
}

QString descriptionOf(const QSqlError& error)
{
    return error.databaseText().isEmpty() ? error.driverText() : error.databaseText();
}

}  // namespace

QtSqlEngine::QtSqlEngine(const QString& driver) : connectionName(nextConnectionName())
{
    database = QSqlDatabase::addDatabase(driver, connectionName);
}

QtSqlEngine::~QtSqlEngine()
{
    database.close();
    database = {};
    QSqlDatabase::removeDatabase(connectionName);
}

void QtSqlEngine::openDatabase()
{
    if (database.open())
        return;
    const QSqlError error = database.lastError();
    throw RuntimeError(CannotOpen, descriptionOf(error)).withDatabaseCodes(error.nativeErrorCode(), sqlState(error));
}

void QtSqlEngine::moveTo(QThread* thread)
{
    database.driver()->moveToThread(thread);
}

QList<std::pair<QString, QString>> QtSqlEngine::versions() const
{
    return {{u"driver"_s, database.driverName() + u" of Qt "_s + QString::fromLatin1(qVersion())}};
}

Answer QtSqlEngine::run(const QString& statement)
{
    QSqlQuery query(database);
    execute(query, statement);
    Answer answer;
    answer.hit = query.numRowsAffected();
    const QSqlRecord record = query.record();
    for (int column = 0; column < record.count(); ++column)
        answer.names.append(record.fieldName(column));
    while (query.next()) {
        for (int column = 0; column < record.count(); ++column)
            answer.values.push_back(query.value(column));
    }
    if (query.lastError().isValid())
        fail(query.lastError());
    return answer;
}

QVariant QtSqlEngine::insert(const QString& statement)
{
    QSqlQuery query(database);
    execute(query, statement);
    return query.lastInsertId();
}

void QtSqlEngine::execute(QSqlQuery& query, const QString& statement)
{
    if (!isOpen())
        throw RuntimeError(CannotOpen, u"The connection to the database is lost."_s);
    query.setForwardOnly(true);
    beforeStatement();
    if (!query.exec(statement))
        fail(query.lastError());
}

void QtSqlEngine::fail(const QSqlError& error)
{
    const bool lost = meansConnectionLost(error);
    if (lost)
        drop();
    throw RuntimeError(lost ? CannotOpen : StatementFailed, descriptionOf(error))
        .withDatabaseCodes(error.nativeErrorCode(), sqlState(error));
}

}  // namespace kest::db

// What the engines that go through a driver of Qt have in common.
#pragma once

#include "platform/database/Engine.h"

#include <QSqlDatabase>

class QSqlError;
class QSqlQuery;

namespace kest::db {

class QtSqlEngine : public Engine {
public:
    ~QtSqlEngine() override;

    Answer run(const QString& statement) override;
    QVariant insert(const QString& statement) override;

protected:
    explicit QtSqlEngine(const QString& driver);

    /// Opens `database`; throws CannotOpen.
    void openDatabase();
    virtual bool meansConnectionLost(const QSqlError& error) const = 0;
    virtual QString sqlState(const QSqlError& error) const = 0;
    virtual void beforeStatement() {}

    QSqlDatabase database;

private:
    void execute(QSqlQuery& query, const QString& statement);
    [[noreturn]] void fail(const QSqlError& error);

    QString connectionName;
};

}  // namespace kest::db

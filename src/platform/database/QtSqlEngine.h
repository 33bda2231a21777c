// What the engines that use a driver of Qt have in common.
#pragma once

#include "platform/database/Engine.h"

#include <QSqlDatabase>

class QSqlError;
class QSqlQuery;

namespace kest::db {

/// An engine that uses a QSqlDatabase.
class QtSqlEngine : public Engine {
public:
    ~QtSqlEngine() override;

    QList<std::pair<QString, QString>> versions() const override;
    Answer run(const QString& statement) override;
    QVariant insert(const QString& statement) override;
    void moveTo(QThread* thread) override;

protected:
    explicit QtSqlEngine(const QString& driver);

    /// Opens `database`. Throws CannotOpen.
    void openDatabase();
    /// Returns true if the error says that the connection is lost.
    virtual bool meansConnectionLost(const QSqlError& error) const = 0;
    /// Returns the SQLSTATE of an error.
    virtual QString sqlState(const QSqlError& error) const = 0;
    /// Called before each statement.
    virtual void beforeStatement() {}
    [[noreturn]] void fail(const QSqlError& error);

    QSqlDatabase database;

private:
    void execute(QSqlQuery& query, const QString& statement);

    QString connectionName;
};

}  // namespace kest::db

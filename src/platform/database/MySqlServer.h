// What MariaDB and MySQL have in common, with any driver.
#pragma once

#include "platform/database/InformationSchema.h"

#include <QSet>
#include <QString>

namespace kest::db {

/// The statements and error codes of MariaDB and MySQL.
class MySqlServer {
public:
    /// `version` is what the server answers to the version statement.
    MySqlServer(Engine& engine, const QString& version);
    static QString versionStatement() { return QStringLiteral("SELECT VERSION()"); }

    /// Returns the terms for queries to INFORMATION_SCHEMA.
    static const InformationSchemaTerms& informationSchema();

    /// Returns the statement that limits the time of the following statements.
    QString timeoutStatement(int seconds) const;

    bool lock(const QString& name, int seconds);
    void unlock(const QString& name);
    void endSession(const QString& session, const QString& lock);

    /// Returns true if an error code of the server says that the connection is lost.
    static bool meansConnectionLost(const QString& nativeCode);
    /// Returns the SQLSTATE for a code of the server, because the driver does not return it.
    static QString sqlState(const QString& nativeCode);

private:
    QString lockName(const QString& name) const;

    Engine& engine_;
    bool isMariaDb;
    QSet<QString> locks;  // checked here, because the server grants a lock twice to the same connection
};

}  // namespace kest::db

// What MariaDB and MySQL have in common, whichever driver reaches them.
#pragma once

#include "platform/database/InformationSchema.h"

#include <QSet>
#include <QString>

namespace kest::db {

class MySqlServer {
public:
    /// Asks which of the two answers.
    explicit MySqlServer(Engine& engine);

    static const InformationSchemaTerms& informationSchema();

    QString timeoutStatement(int seconds) const;

    bool lock(const QString& name, int seconds);
    void unlock(const QString& name);

    static bool meansConnectionLost(const QString& nativeCode);
    /// The driver keeps the state to itself; it follows from the server's own code.
    static QString sqlState(const QString& nativeCode);

private:
    QString lockName(const QString& name) const;

    Engine& engine_;
    bool isMariaDb = false;
    QSet<QString> locks;  // the server gives one twice to the same connection
};

}  // namespace kest::db

// Makes the host's quote database where the host has not made it: the schema, and the rows of a new shop.
#pragma once

#include "platform/database/Connection.h"

#include <QDate>
#include <QString>
#include <QStringList>

namespace kest::app {

enum class Dialect { Embedded, MariaDb };

/// All tables, on an empty database.
void createTables(db::Connection& database, Dialect dialect);
/// What the host puts there before the first quote: settings, stages, colours, the network's insurer.
void fillNewShop(db::Connection& database);
/// Quotes in every state of their network life, with cars, customers and vendors; dates count back from `today`.
void fillDemoShop(db::Connection& database, const QDate& today);

/// An embedded database file `databases/<name>.db` of the profile, made empty where it is missing, and opened.
db::ConnectionPtr openEmbedded(const QString& name);
QString embeddedFile(const QString& name);

/// Makes the files under ":/sql" readable: those of a static library do not register themselves.
void registerResources();

/// The statements of an SQL text, without its comments.
QStringList statementsIn(const QString& script);
/// Days around `today` filled in: "@date-3@" is three days before as yyyy-MM-dd, "@short+10@" ten days after as
/// dd/MM/yyyy.
QString withDates(QString text, const QDate& today);

}  // namespace kest::app

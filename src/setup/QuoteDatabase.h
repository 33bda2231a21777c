// Creates a quote database for a shop without a host: the schema, and the rows of a new shop.
#pragma once

#include "platform/database/Connection.h"

#include <QDate>
#include <QList>
#include <QString>
#include <QStringList>

namespace kest::app {

/// A kind of server. MySql is also MariaDB, and either of them through ODBC.
enum class Server { Embedded, MySql, SqlServer };

/// An index of the quote database.
struct Index {
    QString name;
    QString table;
    QStringList columns;
    QString statement;  // which creates it, on every engine
};
/// Returns the indexes that these statements create.
QList<Index> indexesIn(const QStringList& statements);
/// Returns the indexes that serve the component's searches, as in quote-indexes.sql.
QList<Index> quoteIndexes();
/// Rebuilds all indexes of an embedded quote database, because another tool may have left them in another order, and
/// creates those that it lacks.
void repairIndexes(db::Connection& database);

/// Returns the statements that create the tables of the journal.
QStringList journalStatements(Server server);
/// Creates them.
void createJournal(db::Connection& database, Server server);

/// Returns the statements that create all tables of a quote database. Throws for SQL Server, because there only the
/// host creates them.
QStringList schemaStatements(Server server);
/// Creates all tables and indexes in an empty database.
void createTables(db::Connection& database, Server server);
/// Adds what a host stores before the first quote: settings, stages, colours and the network's insurer.
void fillNewShop(db::Connection& database);
/// Adds quotes in every state of their network life, with cars, customers and vendors. Their dates are relative to
/// `today`.
void fillDemoShop(db::Connection& database, const QDate& today);

/// Opens the embedded database `databases/<name>.db` of the profile. Creates an empty one if it does not exist.
db::ConnectionPtr openEmbedded(const QString& name);
/// Returns the path of that file, a path of this system.
QString embeddedFile(const QString& name);

/// Makes the files under ":/sql" readable. Call it first: the resources of a static library don't register themselves.
void registerResources();

/// Returns the statements of an SQL script, without comments.
QStringList statementsIn(const QString& script);
/// Replaces the dates in a text: "@date-3@" by the date three days before `today` as yyyy-MM-dd, "@short+10@" by the
/// date ten days after it as dd/MM/yyyy.
QString withDates(QString text, const QDate& today);

}  // namespace kest::app

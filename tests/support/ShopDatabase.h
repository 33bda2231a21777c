// The quote database of a test's shop: embedded, or on the server in KEST2_TEST_ENGINE, "mariadb" or "tds".
#pragma once

#include <QByteArray>
#include <QList>
#include <QSqlRecord>
#include <QString>

namespace kest::test {

/// Returns false for the embedded database.
bool shopIsOnServer();
/// Drops the component's connection, as a restart of the server would.
void dropConnection();

/// Closes the connection of the component and that of plainRows().
void closeConnections();

/// Runs a query on a connection that is not the component's.
QList<QSqlRecord> plainRows(const QString& select);
/// Returns the text of a value of such a row: a flag is 1 or 0, a date a short date, Null an empty text.
QString plainText(const QVariant& value);

/// Creates the database of a new shop, with one model for cars, where the settings of the profile expect it. For a
/// server, only sets `ServerName`.
void makeShopDatabase();

/// Saves all rows, for one restoreShopDatabase() at a time. Returns the file of the embedded database.
QByteArray savedShopDatabase();
/// Restores the rows. The connection may be a new one.
void restoreShopDatabase(const QByteArray& file);

}  // namespace kest::test

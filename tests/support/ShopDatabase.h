// The data of a test's shop: its files, and its quote database, which is embedded or on the server in
// KEST2_TEST_ENGINE, "mariadb" or "tds".
#pragma once

#include <QByteArray>
#include <QList>
#include <QMap>
#include <QSqlRecord>
#include <QString>

#include <string>

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

/// Returns all rows of all tables and all files of the drive as text.
std::string holdings();
/// Returns the lines that only one of two such texts has.
std::string difference(const std::string& expected, const std::string& found);

/// Saves the state of a shop. Only one object may exist at a time.
class Snapshot {
public:
    Snapshot();
    /// Restores the files, the rows and the variables that a load passes to the file move. The connection may be a new
    /// one.
    void restore() const;

private:
    QMap<QString, QByteArray> files_;
    QByteArray database_;  // the file, if it is embedded
};

}  // namespace kest::test

// The connection to the host's database.
#pragma once

#include "base/ModRegistry.h"
#include "platform/database/Recordset.h"

#include <QString>

#include <functional>
#include <optional>

namespace kest {

extern db::ConnectionPtr gcnDB;  // the owner; gConn refers to the same object
extern QString gsSAPwd;
extern QString gsDatabase;
extern QString gsServer;
extern QString gsInstance;

/// Returns the connection, which it opens if necessary, or null if that fails.
db::ConnectionPtr GetConnection();
/// Opens the connection if it is closed or if the server has dropped it, and returns whether it is open. Every action
/// of a user that needs the database calls this first. If it fails, whatever uses the connection then throws
/// CannotOpen with the reason.
bool EnsureConnection();
/// Sets what runs each time that EnsureConnection() has opened the connection.
void setAfterOpening(std::function<void()> step);
/// Reads the settings and opens the connection. If that fails, the connection is closed afterwards, and the reason is
/// in the error log.
void OpenDatabase();
/// Returns why the last attempt to open the connection failed, or an empty text if it did not.
QString connectionFailure();
/// Reads server, instance, database and password from the settings. Copies no setting to the machine-wide place.
void readConnectionSettings();
/// Returns the connection text for a driver, made from the variables above, or an empty text if there is no such
/// driver.
QString connectionText(int driverNumber);
/// Returns which database the settings choose, and the versions of the driver and the server that the last connection
/// used. It holds no password.
QString databaseDescription();
/// Returns true if the settings choose the embedded database.
bool usesEmbeddedDatabase();
/// Returns the number of the driver that the settings choose.
int driverNumber(CopyUp copyUp = CopyUp::Yes);
/// Opens a query on a new recordset. If there is no connection, shows a critical box and returns nothing.
std::optional<db::Recordset> OpenRecordset(const QString& select, bool disconnect = false, bool reconnect = false);
/// Opens one more connection to the same database. Throws RuntimeError if that fails.
db::ConnectionPtr anotherConnection();
/// Opens a query on the shared connection `gConn`. Throws RuntimeError if it fails.
db::Recordset opened(const QString& select);
/// Returns the text, cut to the size of the column.
QString cutFor(const db::Recordset& row, const QString& column, const QString& text);
/// Returns the name of this machine, or an empty text if that fails.
QString GetComputerName();

}  // namespace kest

// The one connection to the host's database.
#pragma once

#include "base/ModRegistry.h"
#include "platform/database/Recordset.h"

#include <QString>

#include <optional>

namespace kest {

extern db::ConnectionPtr gcnDB;  // owned here; gConn refers to the same object
extern QString gsSAPwd;
extern QString gsDatabase;
extern QString gsServer;
extern QString gsInstance;

/// The open connection, opened where needed, or null when there is none.
db::ConnectionPtr GetConnection();
/// True when the connection is open, opened where needed, again too where the server has dropped it. Whatever a user
/// starts that needs the database asks for this first.
bool EnsureConnection();
/// Reads the settings and opens the connection; a failure shows only as a closed connection.
void OpenDatabase();
/// Takes server, instance, database and password from the settings, which stay where they are.
void readConnectionSettings();
/// The text that the connection is opened with, from the variables above; empty for a driver number that names none.
QString connectionText(int driverNumber);
/// The number of the driver, by the settings.
int driverNumber(CopyUp copyUp = CopyUp::Yes);
/// A query on a fresh recordset, or none after a critical message when there is no connection.
std::optional<db::Recordset> OpenRecordset(const QString& select, bool disconnect = false, bool reconnect = false);
/// A query on the shared connection `gConn`, open. Failures are thrown.
db::Recordset opened(const QString& select);
/// This machine's name; empty on failure.
QString GetComputerName();

}  // namespace kest

// Finds the ODBC drivers of this machine, and writes the connection text that each needs.
#pragma once

#include "platform/database/ConnectionText.h"
#include "platform/database/Engine.h"

#include <QString>

namespace kest::db {

/// Returns true if the driver is in the list of drivers of this process, this user or this machine.
bool isRegistered(const QString& driver);
/// Returns the name of a registered driver for SQL Server, or an empty text. It is used if the host names a driver that
/// is not registered.
QString sqlServerDriver();

/// Rewrites a connection text of the host for a driver, with server and port in the form that this driver reads, and
/// with additional options. Asks the server for the port of a named instance. Throws CannotOpen if it does not answer.
OdbcTarget odbcTarget(const ConnectionText& text, const QString& driver, const ConnectionText& options);

}  // namespace kest::db

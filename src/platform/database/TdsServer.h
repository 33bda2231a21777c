// Two questions to a SQL Server before a driver connects to it.
#pragma once

#include <QString>

namespace kest::db {

/// Asks the browser service of a host for the port of a named instance. Returns 0 if it does not answer within that
/// time.
int portOfInstance(const QString& host, const QString& instance, int milliseconds);

/// Returns true if a server that speaks the protocol answers on that port within that time.
bool answersHello(const QString& host, int port, int milliseconds);

}  // namespace kest::db

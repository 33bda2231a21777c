// Compares the quote tables that a host made with those that the component uses. Reads only.
#pragma once

#include "setup/QuoteDatabase.h"

#include <QStringList>

namespace kest::app {

/// Returns the kind of server at the other end of a connection.
Server serverOf(const db::ConnectionPtr& connection);

/// What was found in the tables of a host.
struct HostTables {
    QStringList missing;  // tables and columns that are not there, or hold another kind of value
    QStringList notes;    // what works, but is worth knowing: no key, triggers, shorter columns
};

/// Compares the tables of a database with what the component needs. Only reads them.
HostTables lookAtHostTables(const db::ConnectionPtr& connection);

}  // namespace kest::app

// Converts values from drivers to the C++ type of their kind.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/database/Schema.h"

#include <QVariant>

namespace kest::db {

/// Returns the kind of a value if nothing else is known about its column.
Kind kindOfValue(const QVariant& value);

/// Converts a value from a driver to the C++ type of its kind. If a text can't be converted, it stays a text, so that
/// it can be read and shown; using it as a number or a date then fails.
QVariant normalised(const QVariant& value, Kind kind);
/// Returns a value that can be written back bit for bit: converts only what loses nothing.
QVariant exact(const QVariant& value, const TableColumn& column);
/// Returns true if the value already has that type, as most values do.
bool isNormal(const QVariant& value, Kind kind);

}  // namespace kest::db

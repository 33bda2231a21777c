// The values of columns in the one C++ type of their kind, whatever the driver gives.
#pragma once

#include "platform/database/Recordset.h"

#include <QVariant>

namespace kest::db {

/// The kind of a value of which nothing else is known.
Kind kindOfValue(const QVariant& value);

/// A value as it came from a driver in the one C++ type of its kind. A text that is no such value stays a text, so that
/// it can be read and shown, and fails when it is used as a number or a date.
QVariant normalised(const QVariant& value, Kind kind);
/// True if the value has that type already, as most have.
bool isNormal(const QVariant& value, Kind kind);

}  // namespace kest::db

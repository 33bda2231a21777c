// Finds and adds the vendors that messages name.
#pragma once

#include <QString>
#include <QVariant>

namespace kest {

/// Returns the number of the vendor whose name contains `name`. If the shop has none, adds one.
/// Returns 0 for an empty name: a line without a repairer has no vendor.
QVariant findOrAddVendor(const QString& name, const QString& street, const QString& phone);

}  // namespace kest

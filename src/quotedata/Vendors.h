// Finds and adds the vendors that messages name.
#pragma once

#include <QString>
#include <QVariant>

namespace kest {

/// Returns the number of the vendor whose name contains `name`. If the shop has none, adds one.
QVariant findOrAddVendor(const QString& name, const QString& street, const QString& phone);

}  // namespace kest

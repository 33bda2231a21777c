// The vendors of the shop, as far as messages name them.
#pragma once

#include <QString>
#include <QVariant>

namespace kest {

/// The number of the vendor whose name holds `name`; of a new one where the shop knows none.
QVariant findOrAddVendor(const QString& name, const QString& street, const QString& phone);

}  // namespace kest

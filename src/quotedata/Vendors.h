// Finds and adds the vendors that messages name.
#pragma once

#include <QString>
#include <QVariant>

namespace kest {

/// Returns the number of the vendor whose name contains `name`. If the shop has none, adds one.
/// Returns 0 for an empty name: a line without a repairer has no vendor.
QVariant findOrAddVendor(const QString& name, const QString& street, const QString& phone);

/// While an object exists, each vendor is asked for once: a message names the same one in many lines, and no index
/// serves a search inside of names.
class KeptVendors {
public:
    KeptVendors();
    ~KeptVendors();
    Q_DISABLE_COPY_MOVE(KeptVendors)
};

}  // namespace kest

// Finds the files of the checkout.
#pragma once

#include <QString>

namespace kest::test {

/// Returns the absolute path of a file of the checkout, such as "sql/joblink.sql".
QString checkoutFile(const QString& path);

}  // namespace kest::test

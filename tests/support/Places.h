// Where the files of the checkout are.
#pragma once

#include <QString>

namespace kest::test {

/// The absolute path of a file of the checkout, such as "sql/joblink.sql".
QString checkoutFile(const QString& path);

}  // namespace kest::test

// Finds the files of the checkout, and a place for those that tests write.
#pragma once

#include <QString>

namespace kest::test {

/// Returns the absolute path of a file of the checkout, such as "sql/joblink.sql".
QString checkoutFile(const QString& path);

/// Returns a template for QTemporaryDir, in memory if there is room, because databases and safe writes wait for the
/// disk at each change.
QString memoryFolder(const QString& use);

}  // namespace kest::test

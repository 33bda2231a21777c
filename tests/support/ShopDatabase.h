// The quote database of a test's shop: embedded, or on a MariaDB server where KEST2_TEST_ENGINE says "mariadb".
#pragma once

#include <QByteArray>

namespace kest::test {

bool shopIsOnServer();

/// Puts a new shop with one model that cars can have where the settings of the profile then lead: on a server
/// `ServerName` is set, and nothing else.
void makeShopDatabase();

/// The rows as they stand; one at a time.
class SavedShopDatabase {
public:
    SavedShopDatabase();
    /// The connection may be a new one.
    void restore() const;

private:
    QByteArray file_;  // of the embedded database
};

}  // namespace kest::test

// The quote database of a test's shop: embedded, or on a server that KEST2_TEST_ENGINE names, "mariadb" or "tds".
#pragma once

#include <QByteArray>

namespace kest::test {

/// The component's connection to it goes, as when a server is started anew.
void dropConnection();

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

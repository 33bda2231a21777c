// The quote database of a test's shop: embedded, or on the server in KEST2_TEST_ENGINE, "mariadb" or "tds".
#pragma once

#include <QByteArray>

namespace kest::test {

/// Drops the component's connection, as a restart of the server would.
void dropConnection();

/// Creates the database of a new shop, with one model for cars, where the settings of the profile expect it. For a
/// server, only sets `ServerName`.
void makeShopDatabase();

/// Saves all rows. Only one object may exist at a time.
class SavedShopDatabase {
public:
    SavedShopDatabase();
    /// Restores the rows. The connection may be a new one.
    void restore() const;

private:
    QByteArray file_;  // of the embedded database
};

}  // namespace kest::test

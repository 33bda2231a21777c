// Describes all data of a shop as text, and saves and restores it.
#pragma once

#include "support/ShopDatabase.h"

#include <QByteArray>
#include <QMap>
#include <QString>

#include <string>

namespace kest::test {

/// Returns all rows of all tables and all files of the drive as text.
std::string holdings();
/// Returns the lines that only one of two such texts has.
std::string difference(const std::string& expected, const std::string& found);

/// Saves the state of a shop. Only one object may exist at a time.
class Snapshot {
public:
    Snapshot();
    /// Restores the files, the rows and the variables that a load passes to the file move.
    void restore() const;

private:
    QMap<QString, QByteArray> files_;
    QByteArray database_ = savedShopDatabase();
};

}  // namespace kest::test

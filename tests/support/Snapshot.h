// What a shop holds, as text to compare and as a state to go back to.
#pragma once

#include "support/ShopDatabase.h"

#include <QByteArray>
#include <QMap>
#include <QString>

#include <string>

namespace kest::test {

/// All rows of all tables, and all files of the drive.
std::string holdings();
/// The lines that only one of two such texts has.
std::string difference(const std::string& expected, const std::string& found);

/// One at a time.
class Snapshot {
public:
    Snapshot();
    /// Files, rows and what a load hands to the file move.
    void restore() const;

private:
    QMap<QString, QByteArray> files_;
    SavedShopDatabase database_;
};

}  // namespace kest::test

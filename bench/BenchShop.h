// The shop of a benchmark.
#pragma once

#include <QTemporaryDir>

namespace kest {

/// A new shop in a temporary folder, with an embedded database and the folders of its messages. A benchmark adds its
/// own rows.
class BenchShop {
public:
    BenchShop();
    ~BenchShop();
    Q_DISABLE_COPY_MOVE(BenchShop)

    QString root() const { return folder.path(); }

private:
    QTemporaryDir folder;
};

}  // namespace kest

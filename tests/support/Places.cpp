#include "support/Places.h"

namespace kest::test {

QString checkoutFile(const QString& path)
{
    return QStringLiteral(KEST_SOURCE_DIR "/") + path;
}

}  // namespace kest::test

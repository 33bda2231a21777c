#include "shell/com.h"

#include <QUuid>

namespace kest::com {

QString text(const Guid& id)
{
    const auto& tail = id.data4;
    const QUuid uuid(id.data1, id.data2, id.data3, tail[0], tail[1], tail[2], tail[3], tail[4], tail[5], tail[6],
                     tail[7]);
    return uuid.toString().toUpper();
}

std::atomic<long>& serverReferences()
{
    static std::atomic<long> references = 0;
    return references;
}

}  // namespace kest::com

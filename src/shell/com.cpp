#include "shell/com.h"

namespace kest::com {

QString text(const Guid& id)
{
    QString tail;
    for (int i = 0; i < 8; ++i) {
        if (i == 2)
            tail += u'-';
        tail += QStringLiteral("%1").arg(id.data4[i], 2, 16, QLatin1Char('0'));
    }
    return QStringLiteral("{%1-%2-%3-%4}")
        .arg(id.data1, 8, 16, QLatin1Char('0'))
        .arg(id.data2, 4, 16, QLatin1Char('0'))
        .arg(id.data3, 4, 16, QLatin1Char('0'))
        .arg(tail)
        .toUpper();
}

std::atomic<long>& serverReferences()
{
    static std::atomic<long> references = 0;
    return references;
}

}  // namespace kest::com

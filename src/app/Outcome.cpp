#include "app/Outcome.h"

namespace kest::app {

using namespace Qt::StringLiterals;

void say(const QString& text, std::FILE* stream)
{
    const QByteArray bytes = text.toUtf8();
    std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stream);
    std::fflush(stream);
}

Outcome refused(const QString& why, int exitCode)
{
    say(u"kest2: "_s + why + u'\n', stderr);
    return {.exitCode = exitCode};
}

}  // namespace kest::app

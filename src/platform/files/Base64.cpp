#include "platform/files/Base64.h"

#include "platform/RuntimeError.h"
#include "platform/files/SystemFile.h"
#include "platform/files/files.h"

#include <utility>

using namespace Qt::StringLiterals;

namespace kest::files {

namespace {

bool isWhiteSpace(char c)
{
    return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\f' || c == '\v';
}

bool isLetter(char c)
{
    return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '+' || c == '/';
}

bool isBase64(QByteArrayView text)
{
    qsizetype count = 0;
    qsizetype padding = 0;
    for (const char c : text) {
        if (isWhiteSpace(c))
            continue;
        ++count;
        padding += c == '=' ? 1 : 0;
        if (padding > 2 || (c != '=' && (padding > 0 || !isLetter(c))))
            return false;
    }
    return count % 4 == 0;
}

}  // namespace

void decodeBase64(QByteArrayView text, const std::function<void(const QByteArray&)>& take)
{
    constexpr qsizetype lettersAtOnce = 65536;  // a multiple of 4
    if (!isBase64(text))
        throw RuntimeError(TypeMismatch, u"The text is not base64"_s);
    QByteArray letters;
    for (const char c : text) {
        if (!isWhiteSpace(c))
            letters += c;
        if (letters.size() == lettersAtOnce)
            take(QByteArray::fromBase64(std::exchange(letters, {})));
    }
    if (!letters.isEmpty())
        take(QByteArray::fromBase64(letters));
}

void writeBase64(const QString& path, QByteArrayView text, Target target)
{
    replaceFile(placeOf(path, target), spelledPath(path),
                [&](SystemFile& file) { decodeBase64(text, [&](const QByteArray& bytes) { file.write(bytes); }); });
}

}  // namespace kest::files

#include "platform/files/CodePage.h"

#include <algorithm>
#include <iterator>

using namespace Qt::StringLiterals;

namespace kest::files {

namespace {

// The characters of the bytes 0x80 to 0x9F. A byte without a character of its own is the control character with its
// number.
constexpr char16_t upperControls[] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0x008D, 0x017D, 0x008F, 0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,
};

char byteOf(char16_t c)
{
    if (c < 0x80 || (c >= 0xA0 && c <= 0xFF))
        return static_cast<char>(c);
    const auto* place = std::find(std::begin(upperControls), std::end(upperControls), c);
    return place == std::end(upperControls) ? '?' : static_cast<char>(0x80 + (place - std::begin(upperControls)));
}

bool isAscii(QStringView text)
{
    char16_t all = 0;
    for (const QChar c : text)
        all |= c.unicode();
    return all < 0x80;
}

}  // namespace

QByteArray toCodePage(const QString& text)
{
    if (isAscii(QStringView(text)))
        return text.toLatin1();
    QByteArray bytes(text.size(), Qt::Uninitialized);
    char* out = bytes.data();
    for (qsizetype i = 0; i < text.size(); ++i) {
        const bool pair = text[i].isHighSurrogate() && i + 1 < text.size() && text[i + 1].isLowSurrogate();
        *out++ = byteOf(text[i].unicode());
        if (pair)
            ++i;  // a surrogate pair is a single character
    }
    bytes.truncate(out - bytes.constData());
    return bytes;
}

bool isAscii(QByteArrayView bytes)
{
    uchar all = 0;  // not with std::all_of, whose early end prevents that many bytes are tested at once
    for (const char c : bytes)
        all |= static_cast<uchar>(c);
    return all < 0x80;
}

QString fromCodePage(const QByteArray& bytes)
{
    QString text = QString::fromLatin1(bytes);
    if (isAscii(bytes))
        return text;  // nearly all texts
    for (QChar& c : text) {
        if (c >= QChar(0x80) && c < QChar(0xA0))
            c = upperControls[c.unicode() - 0x80];
    }
    return text;
}

}  // namespace kest::files

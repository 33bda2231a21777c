#include "base/CredentialCipher.h"

#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"

#include <QRegularExpression>

#include <nettle/blowfish.h>

#include <array>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr int blockSize = BLOWFISH_BLOCK_SIZE;

// The key consists of the hexadecimal forms of these codes. Every stored password depends on them.
constexpr std::array<int, 36> keyCodes{211, 74,  158, 39,  226, 93,  180, 61,  147, 202, 118, 55,
                                       239, 86,  163, 28,  194, 107, 133, 248, 69,  175, 50,  220,
                                       101, 186, 45,  152, 231, 78,  169, 34,  207, 125, 142, 253};

blowfish_ctx cipher{};

/// Returns a byte for each pair of digits, and one for a single digit at the end.
QByteArray bytesOf(const QString& hex)
{
    static const QRegularExpression digits(u"\\A[0-9A-Fa-f]*\\z"_s);
    if (!digits.match(hex).hasMatch())
        throw RuntimeError(TypeMismatch, u"The stored text contains a pair that is not hexadecimal."_s);
    const qsizetype paired = hex.size() / 2 * 2;
    return QByteArray::fromHex(hex.left(paired).toLatin1()) + QByteArray::fromHex(hex.mid(paired).toLatin1());
}

quint8* raw(QByteArray& bytes)
{
    return reinterpret_cast<quint8*>(bytes.data());
}

}  // namespace

void InitCipherKey()
{
    QString digits;
    for (const int code : keyCodes)
        digits += QString::number(code, 16);
    QByteArray key = bytesOf(digits);
    blowfish_set_key(&cipher, static_cast<size_t>(key.size()), raw(key));
}

QString DecryptText(const QString& hex)
{
    QByteArray bytes = bytesOf(hex);
    bytes.truncate(bytes.size() / blockSize * blockSize);
    if (bytes.isEmpty())
        return {};
    blowfish_decrypt(&cipher, static_cast<size_t>(bytes.size()), raw(bytes), raw(bytes));
    const auto padding = static_cast<quint8>(bytes.back());
    if (padding <= blockSize)
        bytes.chop(padding);
    return files::fromCodePage(bytes);
}

QString encryptText(const QString& plain)
{
    if (plain.isEmpty())
        return {};
    QByteArray bytes = files::toCodePage(plain);
    const qsizetype padding = blockSize - bytes.size() % blockSize;
    bytes.append(padding, static_cast<char>(padding));
    blowfish_encrypt(&cipher, static_cast<size_t>(bytes.size()), raw(bytes), raw(bytes));
    return QString::fromLatin1(bytes.toHex());
}

}  // namespace kest

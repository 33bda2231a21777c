// The cipher of the one stored credential: the password of the outside job system.
#pragma once

#include <QString>

namespace kest {

/// Sets the key for this process; needed before the two below. The panel does it each time it is loaded.
void InitCipherKey();

/// The plain text of hexadecimal digits in either case; empty for an empty text. Bytes behind the last whole block of
/// eight are passed over. Throws TypeMismatch for a pair that is not hexadecimal.
QString DecryptText(const QString& hex);

/// The form in which a credential is stored, so that DecryptText gives it back. Characters outside the code page
/// Windows-1252 become "?".
QString encryptText(const QString& plain);

}  // namespace kest

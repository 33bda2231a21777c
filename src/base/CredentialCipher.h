// The cipher of the only stored credential, the password of the outside job system.
#pragma once

#include <QString>

namespace kest {

/// Sets the key for this process. The panel calls it whenever it is loaded; call it before the functions below.
void InitCipherKey();

/// Decrypts hexadecimal digits in either case. An empty text stays empty, and bytes after the last whole block of eight
/// are ignored. Throws TypeMismatch if a pair is not hexadecimal.
QString DecryptText(const QString& hex);

/// Encrypts a text so that DecryptText() returns it. Characters outside of Windows-1252 become "?".
QString encryptText(const QString& plain);

}  // namespace kest

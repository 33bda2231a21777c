// Converts between texts and the bytes of files.
#pragma once

#include <QByteArray>
#include <QString>

namespace kest::files {

/// Encodes a text in Windows-1252. Other characters become "?".
QByteArray toCodePage(const QString& text);
/// Returns true if all bytes are ASCII characters, which Windows-1252 and UTF-8 encode alike.
bool isAscii(QByteArrayView bytes);
/// Decodes Windows-1252. All 256 bytes are characters.
QString fromCodePage(const QByteArray& bytes);

}  // namespace kest::files

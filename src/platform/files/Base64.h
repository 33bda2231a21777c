// Decodes documents piece by piece, because a document can have many megabytes.
#pragma once

#include "platform/files/files.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QString>

#include <functional>

namespace kest::files {

/// Gives `take` the bytes that a base64 text means, piece by piece. Ignores white space. Throws TypeMismatch for any
/// other character or a wrong length, before the first piece.
void decodeBase64(QByteArrayView text, const std::function<void(const QByteArray&)>& take);
/// Writes the bytes that a base64 text means into a file. Throws as decodeBase64(), and then leaves the file as
/// it was.
void writeBase64(const QString& path, QByteArrayView text, Target target = Target::Unknown);

}  // namespace kest::files

// The text of one recorded change, as it is stored in the journal.
#pragma once

#include "platform/database/Change.h"

#include <QJsonObject>
#include <QString>

namespace kest::journal {

/// JSON in plain ASCII, so that no code page or driver changes it.
QString asciiJson(const QJsonObject& object);

/// Every value comes back bit for bit.
QString textOf(const db::RowChange& change);
/// Throws TypeMismatch for a text that `textOf` did not write.
db::RowChange changeIn(const QString& text);

}  // namespace kest::journal

// Reports an unexpected failure: a box, and a record in kest2error.log beside the component.
#pragma once

#include "platform/RuntimeError.h"

#include <QString>

namespace kest {

enum LogMode : int { BoxOnly = 0, BoxAndFile = 1 };

/// `line` is 0 where no statement number is known. Throws when the file cannot be written, the box having been shown.
void LogError(int line, const QString& source, const QString& number, const QString& description, const QString& title,
              int mode);
/// The same for a failure in hand, with its box and its record.
void LogError(const RuntimeError& error, const QString& source, const QString& title);

/// True when the file exists and is at least 1,048,576 bytes long.
bool LogIsFull(const QString& path);
/// Where records go.
QString errorLogPath();

/// Blanks trimmed at both ends, every double quote turned into a single one.
QString QuoteClean(const QString& text);

}  // namespace kest

// Reports unexpected errors with a box and a record in kest2error.log, which is in the component's folder.
#pragma once

#include "platform/RuntimeError.h"

#include <QString>

namespace kest {

enum LogMode : int { BoxOnly = 0, BoxAndFile = 1 };

/// Shows a box and, with the mode BoxAndFile, adds a record to the file. Pass 0 as `line` if it is unknown. If the file
/// can't be written, the box says so, and the failure is thrown as one that the user knows already (`isTold`).
void LogError(int line, const QString& source, const QString& number, const QString& description, const QString& title,
              int mode);
/// Reports an exception with a box and a record. If a box has already shown it, only throws it again.
void LogError(const RuntimeError& error, const QString& source, const QString& title);

/// Adds a record without a box. Throws RuntimeError if the file can't be written.
void logFailure(const RuntimeError& error, const QString& source);

/// Returns true if the file exists and has at least 1,048,576 bytes.
bool LogIsFull(const QString& path);
/// Returns the path of the error log.
QString errorLogPath();
/// Returns the last record of the error log, or an empty text if there is none.
QString lastLogRecord();

/// Removes blanks at both ends and replaces double quotes by single ones.
QString QuoteClean(const QString& text);

}  // namespace kest

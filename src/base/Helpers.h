// The small text, number and date routines by whose exact rules messages are read.
#pragma once

#include <QDateTime>
#include <QString>

#include <utility>

namespace kest {

/// Every occurrence of `search` replaced, from left to right, without regard to case; what was put in is not searched.
QString ReplaceText(const QString& text, const QString& replacement, const QString& search);
/// "0" put in front up to the length; a text at or above it comes back unchanged.
QString PadZeroLeft(const QString& text, int length);
/// The number in a text that may hold anything else: the text as a number, else the number that its digits and points
/// make, else the fallback's. Never fails.
double SafeVal(const QString& text, const QString& fallback);
/// "UNIVERSAL" for "TBA", "UNIVERSAL", "ADVISE" and an empty registration; any other comes back as it is.
QString NormaliseRego(const QString& rego);
/// "123/0" and "123" are "123"; "123/2" stays.
QString NormaliseQuoteRef(const QString& reference);
/// Quote number and subquote; without a "/" the subquote is "0".
std::pair<QString, QString> SplitQuoteRef(const QString& reference);
/// The text's letters and digits.
QString AlphaNumericOnly(const QString& text);
/// The part behind the last dot, trimmed, in upper case; empty without a dot.
QString GetExtensionUpper(const QString& fileName);
/// A message's date and time in universal time as local "d/M/yyyy H:mm AM/PM" on a 12-hour clock; empty for an empty
/// text. Throws TypeMismatch for a text that is no date.
QString FormatNetworkDate(const QString& text);
QDateTime UtcToLocal(const QDateTime& universal);

}  // namespace kest

// Small routines for texts, numbers and dates. Messages are read by their exact rules.
#pragma once

#include <QDateTime>
#include <QString>

#include <utility>

namespace kest {

/// Replaces every occurrence of `search`, in any case, from left to right. The replacement itself is not searched.
QString ReplaceText(const QString& text, const QString& replacement, const QString& search);
/// Adds zeros on the left up to the length. A text that is long enough stays as it is.
QString PadZeroLeft(const QString& text, int length);
/// Returns the text as a number or, if it is not one, the number that its digits and points form, or else the fallback.
/// Never throws.
double SafeVal(const QString& text, const QString& fallback);
/// Returns "UNIVERSAL" for "TBA", "UNIVERSAL", "ADVISE" and an empty text. Any other registration stays as it is.
QString NormaliseRego(const QString& rego);
/// Removes a subquote of 0: "123/0" becomes "123"; "123" and "123/2" stay.
QString NormaliseQuoteRef(const QString& reference);
/// Returns the quote number and the subquote. Without a "/" the subquote is "0".
std::pair<QString, QString> SplitQuoteRef(const QString& reference);
/// Returns true if a text has no character but white space.
bool isBlank(const QString& text);
/// Removes the blanks, and no other white space, from both ends.
QString trimBlanks(const QString& text);
/// Returns the letters and digits of a text.
QString AlphaNumericOnly(const QString& text);
/// Returns the part after the last dot, trimmed and in upper case, or an empty text if there is no dot.
QString GetExtensionUpper(const QString& fileName);
/// Converts a message's date and time from universal to local time, in the form "d/M/yyyy H:mm AM/PM" with a 12-hour
/// clock. An empty text stays empty. Throws TypeMismatch if the text is not a date.
QString FormatNetworkDate(const QString& text);
/// Converts universal time to the local time of this machine.
QDateTime UtcToLocal(const QDateTime& universal);

}  // namespace kest

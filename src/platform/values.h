// Converts column values and message texts to numbers, flags, dates and texts. All conversions are made here.
#pragma once

#include "platform/dates.h"

#include <QDateTime>
#include <QString>
#include <QVariant>

#include <optional>

namespace kest {

// These functions accept the following forms, with or without blanks around them, and no others:
//   number   sign, digits, commas between groups of three, one point, an exponent: "1,234.50", "-.5", "1e3"
//   Boolean  "true" or "false" in any case, or a number
//   date     yyyy-MM-dd, the same with "T" or a blank and HH:m[:ss[.f]] and a zone mark, d/M/yyyy, the same with a
//            time of a 12- or 24-hour clock
// A zone mark is ignored: date and time stay as they are written.
// They throw NullValue for a Null, TypeMismatch for any other text, and Overflow for a number that is too large.

/// Returns a number.
double toDouble(const QVariant& value);
/// Returns a 32-bit whole number. A fraction is rounded to the nearest number, a half to the even one.
qint64 toLong(const QVariant& value);
/// Returns a 16-bit whole number, rounded like toLong(). Throws Overflow outside of -32768 to 32767.
qint64 toInteger(const QVariant& value);
/// Returns a flag. Any number except 0 is true.
bool toBool(const QVariant& value);
/// Returns the flag of a column, or false for a Null.
inline bool isTrue(const QVariant& flag)
{
    return !flag.isNull() && toBool(flag);
}
/// Returns a date.
QDateTime toDate(const QVariant& value);

/// Returns the number in a text, or nothing if the text is not a number.
std::optional<double> numberIn(const QString& text);

/// Returns the number at the start of a text, or 0 if there is none. Skips blanks, even between digits, and ignores the
/// rest.
double leadingNumber(const QString& text);

/// Returns a value as text: a short date, followed by the time ("2:05:00 PM") if it is not midnight; "True" or "False";
/// or a number as numberText() writes it. Throws NullValue for a Null.
QString toText(const QVariant& value);
/// Returns the value as text, or an empty text for a Null.
QString textOrEmpty(const QVariant& value);

/// Returns a number with up to 15 significant digits, without exponent from 1e-10 to below 1e16, and never "-0".
QString numberText(double value);

}  // namespace kest

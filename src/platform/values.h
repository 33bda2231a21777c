// Turns column values and message texts into numbers, flags, dates and texts: the one place that converts.
#pragma once

#include <QDateTime>
#include <QString>
#include <QVariant>

#include <optional>

namespace kest {

// The readers below take these forms, blanks around them allowed, and no others:
//   number   sign, digits, commas between groups of three, one point, an exponent: "1,234.50", "-.5", "1e3"
//   Boolean  "true" or "false" in any case, or a number
//   date     yyyy-MM-dd, the same with "T" or a blank and HH:m[:ss[.f]] and a zone mark, d/M/yyyy, the same with a
//            time of a 12- or 24-hour clock
// A zone mark is passed over: date and time stand as they are written.
// A Null throws NullValue, any other text TypeMismatch, a number too large for the result Overflow.

double toDouble(const QVariant& value);
/// A whole number of 32 bits; a fraction is rounded to the nearest, halves to the even one.
qint64 toLong(const QVariant& value);
/// A whole number of 16 bits, with Overflow outside -32768 to 32767.
qint64 toInteger(const QVariant& value);
bool toBool(const QVariant& value);
/// The flag of a column: a Null counts as false.
inline bool isTrue(const QVariant& flag)
{
    return !flag.isNull() && toBool(flag);
}
QDateTime toDate(const QVariant& value);
/// A date as columns hold it: in no time zone, so that the hour which a clock change leaves out is an hour like others.
QDateTime columnDate(const QDate& date, const QTime& time);

/// The number in a text, or none where the text is no number.
std::optional<double> numberIn(const QString& text);
std::optional<QDateTime> dateIn(const QString& text);
bool isNumeric(const QVariant& value);

/// The number at the start of a text: blanks are skipped wherever they stand, the rest behind it is passed over, 0
/// where there is none.
double leadingNumber(const QString& text);

/// Any value as text: short date, with the time ("2:05:00 PM") when it is not midnight; "True" and "False"; general
/// number text. Throws NullValue for a Null.
QString toText(const QVariant& value);
/// The value followed by an empty text: a Null is the empty text.
QString textOrEmpty(const QVariant& value);

/// General number text: up to 15 significant digits, no exponent from 1e-10 to below 1e16, never "-0".
QString numberText(double value);
/// dd/MM/yyyy, always ten characters.
QString shortDate(const QDate& date);

}  // namespace kest

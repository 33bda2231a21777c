// Reads and writes dates in the forms of messages and columns.
#pragma once

#include <QDateTime>
#include <QString>

#include <optional>

namespace kest {

/// Returns the date in a text, or nothing if the text is not a date. values.h lists the forms.
std::optional<QDateTime> dateIn(const QString& text);
/// Returns a date as columns store it. It has no time zone, so the hour that a clock change skips is a normal hour.
QDateTime columnDate(const QDate& date, const QTime& time);
/// Returns a date as dd/MM/yyyy, always ten characters.
QString shortDate(const QDate& date);

}  // namespace kest

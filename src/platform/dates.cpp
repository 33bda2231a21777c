#include "platform/dates.h"

#include <QRegularExpression>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

/// Reads yyyy-MM-dd, alone or with a 24-hour time, a fraction and a zone mark.
const QRegularExpression& isoForm()
{
    static const QRegularExpression form(QRegularExpression::anchoredPattern(
        uR"([ \t\r\n]*(?<year>\d{4})-(?<month>\d\d)-(?<day>\d\d))"
        uR"((?:[T ](?<hour>\d\d):(?<minute>\d\d?)(?::(?<second>\d\d?)(?:\.(?<fraction>\d+))?)?)"
        uR"((?:[Zz]|[-+]\d\d(?::?\d\d)?)?)?[ \t\r\n]*)"_s));
    return form;
}

/// Reads d/M/yyyy, alone or with a 24-hour time, or with a 12-hour time and AM or PM.
const QRegularExpression& shortForm()
{
    static const QRegularExpression form(
        QRegularExpression::anchoredPattern(uR"([ \t\r\n]*(?<day>\d\d?)/(?<month>\d\d?)/(?<year>\d{4}))"
                                            uR"((?: [ \t\r\n]*(?<hour>\d\d?):(?<minute>\d\d)(?::(?<second>\d\d))?)"
                                            uR"([ \t\r\n]*(?<marker>[AaPp][Mm])?)?[ \t\r\n]*)"_s));
    return form;
}

/// Returns the hour of a 24-hour clock, or -1 if the hour does not fit the marker.
int hourOf(int hour, const QString& marker)
{
    if (marker.isEmpty())
        return hour;
    if (hour < 1 || hour > 12)
        return -1;
    return hour % 12 + (marker.startsWith(u'p', Qt::CaseInsensitive) ? 12 : 0);
}

}  // namespace

QDateTime columnDate(const QDate& date, const QTime& time)
{
    return QDateTime(date, time, Qt::UTC);
}

std::optional<QDateTime> dateIn(const QString& text)
{
    QRegularExpressionMatch found = isoForm().match(text);
    if (!found.hasMatch())
        found = shortForm().match(text);
    if (!found.hasMatch())
        return {};
    const auto number = [&](const QString& part) { return found.captured(part).toInt(); };
    const QDate date(number(u"year"_s), number(u"month"_s), number(u"day"_s));
    const int milliseconds = found.captured(u"fraction"_s).leftJustified(3, u'0', true).toInt();
    const QTime time(hourOf(number(u"hour"_s), found.captured(u"marker"_s)), number(u"minute"_s), number(u"second"_s),
                     milliseconds);
    if (!date.isValid() || !time.isValid())
        return {};
    return columnDate(date, time);
}

QString shortDate(const QDate& date)
{
    return date.toString(u"dd/MM/yyyy");
}

}  // namespace kest

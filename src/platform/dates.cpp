#include "platform/TextReader.h"
#include "platform/values.h"

using namespace Qt::StringLiterals;

namespace kest {

namespace {

/// Reads the rest of a text after its date: a 24-hour time, with a fraction and a zone mark if they are there.
std::optional<QTime> readIsoTime(TextReader& reader)
{
    const auto hour = reader.number(2, 2);
    if (!hour || !reader.take(u':'))
        return {};
    const auto minute = reader.number(1, 2);
    if (!minute)
        return {};
    int second = 0;
    int millisecond = 0;
    if (reader.take(u':')) {
        const auto seconds = reader.number(1, 2);
        if (!seconds)
            return {};
        second = *seconds;
        if (reader.take(u'.')) {
            const QStringView fraction = reader.digits();
            if (fraction.isEmpty())
                return {};
            millisecond = (fraction.toString() + u"00"_s).left(3).toInt();
        }
    }
    if (!reader.takeAnyOf(u"Zz") && reader.takeAnyOf(u"+-")) {
        if (!reader.number(2, 2))
            return {};
        const bool colon = reader.take(u':');
        const qsizetype digits = reader.digits(2).size();
        if (digits == 1 || (colon && digits == 0))
            return {};
    }
    const QTime time(*hour, *minute, second, millisecond);
    return reader.atEnd() && time.isValid() ? std::optional(time) : std::nullopt;
}

/// Reads the rest of a text after its date: a 24-hour time, or a 12-hour time with AM or PM.
std::optional<QTime> readClock(TextReader& reader)
{
    auto hour = reader.number(1, 2);
    if (!hour || !reader.take(u':'))
        return {};
    const auto minute = reader.number(2, 2);
    if (!minute)
        return {};
    const auto second = reader.take(u':') ? reader.number(2, 2) : std::optional(0);
    if (!second)
        return {};
    reader.skipBlanks();
    if (!reader.atEnd()) {
        const bool afternoon = reader.takeAnyOf(u"pP");
        if ((!afternoon && !reader.takeAnyOf(u"aA")) || !reader.takeAnyOf(u"mM") || *hour < 1 || *hour > 12)
            return {};
        *hour = *hour % 12 + (afternoon ? 12 : 0);
    }
    const QTime time(*hour, *minute, *second);
    return reader.atEnd() && time.isValid() ? std::optional(time) : std::nullopt;
}

std::optional<QDateTime> joined(const QDate& date, const std::optional<QTime>& time)
{
    if (!date.isValid() || !time)
        return {};
    return columnDate(date, *time);
}

std::optional<QDateTime> readDate(QStringView text)
{
    const QStringView trimmed = withoutBlanks(text);
    TextReader reader(trimmed);
    if (trimmed.size() > 4 && trimmed[4] == u'-') {
        const auto year = reader.number(4, 4);
        reader.take(u'-');
        const auto month = reader.number(2, 2);
        if (!year || !month || !reader.take(u'-'))
            return {};
        const auto day = reader.number(2, 2);
        if (!day)
            return {};
        const QDate date(*year, *month, *day);
        if (reader.atEnd())
            return joined(date, QTime(0, 0));
        return reader.takeAnyOf(u"T ") ? joined(date, readIsoTime(reader)) : std::nullopt;
    }
    const auto day = reader.number(1, 2);
    if (!day || !reader.take(u'/'))
        return {};
    const auto month = reader.number(1, 2);
    if (!month || !reader.take(u'/'))
        return {};
    const auto year = reader.number(4, 4);
    if (!year)
        return {};
    const QDate date(*year, *month, *day);
    if (reader.atEnd())
        return joined(date, QTime(0, 0));
    if (!reader.take(u' '))
        return {};
    reader.skipBlanks();
    return joined(date, readClock(reader));
}

}  // namespace

QDateTime columnDate(const QDate& date, const QTime& time)
{
    return QDateTime(date, time, Qt::UTC);
}

std::optional<QDateTime> dateIn(const QString& text)
{
    return readDate(text);
}

QString shortDate(const QDate& date)
{
    if (!date.isValid())
        return {};
    return QString::asprintf("%02d/%02d/%04d", date.day(), date.month(), date.year());
}

}  // namespace kest

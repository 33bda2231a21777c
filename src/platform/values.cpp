#include "platform/values.h"

#include "platform/RuntimeError.h"

#include <QLocale>
#include <QRegularExpression>

#include <algorithm>
#include <cmath>
#include <limits>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

/// The forms of a number are described in values.h. The captured text does not include the blanks around it.
const QRegularExpression& numberForm()
{
    static const QRegularExpression form(QRegularExpression::anchoredPattern(
        uR"([ \t\r\n]*([-+]?(?:(?:\d{1,3}(?:,\d{3})+|\d+)(?:\.\d*)?|\.\d+)(?:[eE][-+]?\d+)?)[ \t\r\n]*)"_s));
    return form;
}

/// Returns the number in a text: infinity if it is too large for the type, and 0 if it is too near to 0.
std::optional<double> readNumber(const QString& text)
{
    if (text.isEmpty())
        return {};  // as many settings are; the pattern is expensive when it is first used
    bool read = false;
    // reads most texts, but not digits in groups; also accepts "inf" and "nan", which are not numbers
    const double plain = text.toDouble(&read);
    if (read && std::isfinite(plain))
        return plain;
    const QRegularExpressionMatch number = numberForm().match(text);
    if (!number.hasMatch())
        return {};
    return number.captured(1).remove(u',').toDouble();
}

[[noreturn]] void failAsNull()
{
    throw RuntimeError(NullValue, u"Invalid use of Null"_s);
}

[[noreturn]] void failAsWrongType()
{
    throw RuntimeError(TypeMismatch, u"Type mismatch"_s);
}

[[noreturn]] void failAsTooLarge()
{
    throw RuntimeError(Overflow, u"Overflow"_s);
}

qint64 wholeNumber(const QVariant& value, qint64 least, qint64 most)
{
    const double rounded = std::nearbyint(toDouble(value));  // rounds a half to the even number
    if (!(rounded >= static_cast<double>(least) && rounded <= static_cast<double>(most)))
        failAsTooLarge();
    return static_cast<qint64>(rounded);
}

/// Checks that a number is not too large.
double finite(double number)
{
    if (!std::isfinite(number))
        failAsTooLarge();
    return number;
}

QString timeText(const QTime& time)
{
    return QLocale::c().toString(time, u"h:mm:ss AP");
}

}  // namespace

double toDouble(const QVariant& value)
{
    if (value.isNull())
        failAsNull();
    if (value.userType() == QMetaType::QString) {
        if (const auto number = readNumber(*static_cast<const QString*>(value.constData())))
            return finite(*number);
        failAsWrongType();
    }
    bool isNumber = false;
    const double number = value.toDouble(&isNumber);
    if (!isNumber)
        failAsWrongType();
    return number;
}

qint64 toLong(const QVariant& value)
{
    return wholeNumber(value, std::numeric_limits<qint32>::min(), std::numeric_limits<qint32>::max());
}

qint64 toInteger(const QVariant& value)
{
    return wholeNumber(value, std::numeric_limits<qint16>::min(), std::numeric_limits<qint16>::max());
}

bool toBool(const QVariant& value)
{
    if (value.userType() == QMetaType::QString) {
        const QString word = value.toString().trimmed();
        if (word.compare("true"_L1, Qt::CaseInsensitive) == 0)
            return true;
        if (word.compare("false"_L1, Qt::CaseInsensitive) == 0)
            return false;
    }
    return toDouble(value) != 0;
}

QDateTime toDate(const QVariant& value)
{
    if (value.isNull())
        failAsNull();
    switch (value.userType()) {
        case QMetaType::QDateTime: {
            const QDateTime moment = value.toDateTime();
            if (!moment.date().isValid())
                failAsNull();
            return columnDate(moment.date(), moment.time());
        }
        case QMetaType::QDate: {
            const QDate date = value.toDate();
            if (!date.isValid())
                failAsNull();
            return columnDate(date, QTime(0, 0));
        }
        case QMetaType::QString:
            if (const auto moment = dateIn(value.toString()))
                return *moment;
            break;
        default:
            break;
    }
    failAsWrongType();
}

std::optional<double> numberIn(const QString& text)
{
    const auto number = readNumber(text);
    return number && std::isfinite(*number) ? number : std::nullopt;
}

double leadingNumber(const QString& text)
{
    if (!text.isEmpty() && std::ranges::all_of(text, [](QChar letter) { return letter >= u'0' && letter <= u'9'; }))
        return finite(text.toDouble());  // the usual text; the patterns are expensive when they are first used
    static const QRegularExpression blanks(u"[ \\t\\r\\n]"_s);
    static const QRegularExpression start(uR"(\A[-+]?(?:\d+\.?\d*|\.\d+)(?:[eE][-+]?\d+)?)"_s);
    return finite(start.match(QString(text).remove(blanks)).captured().toDouble());
}

QString toText(const QVariant& value)
{
    if (value.isNull())
        failAsNull();
    switch (value.userType()) {
        case QMetaType::QString:
            return value.toString();
        case QMetaType::Bool:
            return value.toBool() ? u"True"_s : u"False"_s;
        case QMetaType::Double:
        case QMetaType::Float:
            return numberText(value.toDouble());
        case QMetaType::QDate:
            return shortDate(value.toDate());
        case QMetaType::QTime:
            return timeText(value.toTime());
        case QMetaType::QDateTime: {
            const QDateTime moment = value.toDateTime();
            const QString date = shortDate(moment.date());
            const QTime time = moment.time();
            return time == QTime(0, 0) || date.isEmpty() ? date : date + u' ' + timeText(time);
        }
        default:
            return value.toString();
    }
}

QString textOrEmpty(const QVariant& value)
{
    return value.isNull() ? QString() : toText(value);
}

QString numberText(double value)
{
    constexpr int digitsKept = 15;
    constexpr double tooLargeForPlain = 1e16;
    constexpr double tooSmallForPlain = 1e-10;
    if (value == 0)
        return u"0"_s;  // never "-0"
    const QString general = QString::number(finite(value), 'g', digitsKept);
    if (!general.contains(u'e'))
        return general;
    const double kept = general.toDouble();
    if (std::abs(kept) >= tooLargeForPlain || std::abs(kept) < tooSmallForPlain)
        return general.toUpper();
    return QString::number(kept, 'f', QLocale::FloatingPointShortest);
}

}  // namespace kest

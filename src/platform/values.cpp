#include "platform/values.h"

#include "platform/RuntimeError.h"
#include "platform/TextReader.h"

#include <QByteArray>
#include <QVarLengthArray>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <string_view>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

enum class Reading { Number, TooLarge, NoNumber };

/// Returns true if a number outside of the type's range is too large, and false if it is too near to 0.
bool isAboveRange(std::string_view plain)
{
    const size_t mark = std::min(plain.find('e'), plain.size());
    const size_t point = std::min(plain.find('.'), mark);
    const size_t firstDigit = plain.find_first_of("123456789");
    qint64 exponent = 0;
    if (mark < plain.size()) {
        const bool negative = plain[mark + 1] == '-';
        const auto [end, error] = std::from_chars(plain.data() + mark + 1, plain.data() + plain.size(), exponent);
        if (error == std::errc::result_out_of_range)
            return !negative;
    }
    return exponent + static_cast<qint64>(point) - static_cast<qint64>(firstDigit) > 0;
}

/// Converts plain digits to a number. A number that is too near to 0 becomes 0.
Reading fromPlainDigits(const QVarLengthArray<char, 64>& plain, double& result)
{
    const auto [end, error] = std::from_chars(plain.cbegin(), plain.cend(), result);
    if (error == std::errc::result_out_of_range) {
        result = 0;
        return isAboveRange({plain.cbegin(), static_cast<size_t>(plain.size())}) ? Reading::TooLarge : Reading::Number;
    }
    return error == std::errc() && end == plain.cend() ? Reading::Number : Reading::NoNumber;
}

void append(QVarLengthArray<char, 64>& plain, QStringView digits)
{
    for (const QChar digit : digits)
        plain.append(digit.toLatin1());
}

Reading readNumber(QStringView text, double& result)
{
    TextReader reader(withoutBlanks(text));
    QVarLengthArray<char, 64> plain;
    if (reader.take(u'-'))
        plain.append('-');
    else
        reader.take(u'+');

    const QStringView first = reader.digits();
    append(plain, first);
    while (reader.take(u',')) {
        const QStringView group = reader.digits(3);
        if (first.isEmpty() || first.size() > 3 || group.size() != 3)
            return Reading::NoNumber;
        append(plain, group);
    }
    bool anyDigit = !first.isEmpty();
    if (reader.take(u'.')) {
        plain.append('.');
        const QStringView fraction = reader.digits();
        append(plain, fraction);
        anyDigit = anyDigit || !fraction.isEmpty();
    }
    if (!anyDigit)
        return Reading::NoNumber;
    if (reader.takeAnyOf(u"eE")) {
        plain.append('e');
        if (reader.take(u'-'))
            plain.append('-');
        else
            reader.take(u'+');
        const QStringView exponent = reader.digits();
        if (exponent.isEmpty())
            return Reading::NoNumber;
        append(plain, exponent);
    }
    return reader.atEnd() ? fromPlainDigits(plain, result) : Reading::NoNumber;
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

bool isWholeNumberType(int type)
{
    switch (type) {
        case QMetaType::Int:
        case QMetaType::UInt:
        case QMetaType::LongLong:
        case QMetaType::ULongLong:
        case QMetaType::Long:
        case QMetaType::ULong:
        case QMetaType::Short:
        case QMetaType::UShort:
        case QMetaType::Char:
        case QMetaType::SChar:
        case QMetaType::UChar:
        case QMetaType::Bool:
            return true;
        default:
            return false;
    }
}

qint64 wholeNumber(const QVariant& value, qint64 least, qint64 most)
{
    const double rounded = std::nearbyint(toDouble(value));  // rounds a half to the even number
    if (!(rounded >= static_cast<double>(least) && rounded <= static_cast<double>(most)))
        failAsTooLarge();
    return static_cast<qint64>(rounded);
}

QString timeText(const QTime& time)
{
    const int hour = time.hour() % 12 == 0 ? 12 : time.hour() % 12;
    return QString::asprintf("%d:%02d:%02d %s", hour, time.minute(), time.second(), time.hour() < 12 ? "AM" : "PM");
}

}  // namespace

double toDouble(const QVariant& value)
{
    if (value.isNull())
        failAsNull();
    const int type = value.userType();
    if (type == QMetaType::Double || type == QMetaType::Float)
        return value.toDouble();
    if (isWholeNumberType(type))
        return static_cast<double>(value.toLongLong());
    if (type != QMetaType::QString)
        failAsWrongType();
    double result = 0;
    switch (readNumber(*static_cast<const QString*>(value.constData()), result)) {
        case Reading::Number:
            return result;
        case Reading::TooLarge:
            failAsTooLarge();
        case Reading::NoNumber:
            break;
    }
    failAsWrongType();
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
        const QString text = value.toString();
        const QStringView word = withoutBlanks(text);
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
    double result = 0;
    if (readNumber(text, result) != Reading::Number)
        return {};
    return result;
}

bool isNumeric(const QVariant& value)
{
    if (value.isNull())
        return false;
    const int type = value.userType();
    if (type == QMetaType::QString)
        return numberIn(value.toString()).has_value();
    return type == QMetaType::Double || type == QMetaType::Float || isWholeNumberType(type);
}

double leadingNumber(const QString& text)
{
    QVarLengthArray<char, 64> plain;
    qsizetype usable = 0;  // the length of `plain` up to which it is a complete number
    bool pointSeen = false;
    bool exponentSeen = false;
    for (const QChar c : text) {
        if (isBlank(c))
            continue;
        const bool atStart = plain.isEmpty() || plain.back() == 'e';
        if (isDigit(c)) {
            plain.append(c.toLatin1());
            usable = plain.size();
        } else if (atStart && c == u'-') {
            plain.append('-');
        } else if (c == u'.' && !pointSeen && !exponentSeen) {
            pointSeen = true;
            plain.append('.');
        } else if ((c == u'e' || c == u'E') && usable > 0 && !exponentSeen) {
            exponentSeen = true;
            plain.append('e');
        } else if (!(atStart && c == u'+')) {
            break;
        }
    }
    plain.resize(usable);
    double result = 0;
    if (usable == 0)
        return 0;
    switch (fromPlainDigits(plain, result)) {
        case Reading::Number:
            return result;
        case Reading::TooLarge:
            failAsTooLarge();
        case Reading::NoNumber:
            break;
    }
    return 0;
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
    constexpr int largestPlainExponent = 15;
    constexpr int smallestPlainExponent = -10;
    if (!std::isfinite(value))
        failAsTooLarge();
    if (value == 0)
        return u"0"_s;

    char buffer[32];  // -d.dddddddddddddde-ddd
    const auto end =
        std::to_chars(buffer, buffer + sizeof buffer, std::abs(value), std::chars_format::scientific, digitsKept - 1)
            .ptr;
    char* const mark = std::find(buffer, end, 'e');
    QString digits = QChar::fromLatin1(buffer[0]) + QString::fromLatin1(buffer + 2, mark - buffer - 2);
    while (digits.endsWith(u'0'))
        digits.chop(1);
    int exponent = 0;
    std::from_chars(mark[1] == '+' ? mark + 2 : mark + 1, end, exponent);

    const QString sign = value < 0 ? u"-"_s : QString();
    if (exponent > largestPlainExponent || exponent < smallestPlainExponent) {
        const QString fraction = digits.size() > 1 ? u'.' + digits.sliced(1) : QString();
        const QString power =
            (exponent < 0 ? u"-"_s : u"+"_s) + QString::number(std::abs(exponent)).rightJustified(2, u'0');
        return sign + digits[0] + fraction + u'E' + power;
    }
    if (exponent < 0)
        return sign + u"0."_s + QString(-exponent - 1, u'0') + digits;
    if (digits.size() <= exponent + 1)
        return sign + digits.leftJustified(exponent + 1, u'0');
    return sign + digits.first(exponent + 1) + u'.' + digits.sliced(exponent + 1);
}

}  // namespace kest

#include "platform/database/ColumnValues.h"

#include "platform/values.h"

#include <QDateTime>

#include <cmath>
#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

QString textOf(const QVariant& value)
{
    if (value.typeId() == QMetaType::QByteArray)
        return QString::fromUtf8(value.toByteArray());
    return value.typeId() == QMetaType::QString ? value.toString() : toText(value);
}

/// Reads "yyyy-MM-dd HH:mm:ss", the form in which dates are stored. This is faster than a general parser.
QDateTime storedDate(const QString& text)
{
    if (text.size() != 19 || text[4] != u'-' || text[7] != u'-' || text[10] != u' ' || text[13] != u':')
        return {};
    const auto number = [&](int start, int length) { return QStringView(text).sliced(start, length).toInt(); };
    const QDate date(number(0, 4), number(5, 2), number(8, 2));
    const QTime time(number(11, 2), number(14, 2), number(17, 2));
    return date.isValid() && time.isValid() ? columnDate(date, time) : QDateTime();
}

QVariant asDate(const QVariant& value)
{
    if (value.typeId() == QMetaType::QDateTime)
        return columnDate(value.toDateTime().date(), value.toDateTime().time());
    if (value.typeId() == QMetaType::QDate)
        return columnDate(value.toDate(), QTime(0, 0));
    const QString text = textOf(value);
    if (const QDateTime stored = storedDate(text); stored.isValid())
        return stored;
    const std::optional<QDateTime> read = dateIn(text);
    return read ? QVariant(*read) : QVariant(text);
}

QVariant asNumber(const QVariant& value, Kind kind)
{
    std::optional<double> number;
    switch (kindOfValue(value)) {
        case Kind::Flag:
            return kind == Kind::Number ? QVariant(value.toBool() ? 1.0 : 0.0) : QVariant(qint64(value.toBool()));
        case Kind::WholeNumber:
            return kind == Kind::Number ? QVariant(value.toDouble()) : QVariant(value.toLongLong());
        case Kind::Number:
            number = value.toDouble();
            break;
        default:
            number = numberIn(textOf(value));
            break;
    }
    if (!number)
        return textOf(value);
    const bool whole = kind == Kind::WholeNumber && std::floor(*number) == *number && std::abs(*number) < 9.2e18;
    return whole ? QVariant(qint64(*number)) : QVariant(*number);
}

QVariant asFlag(const QVariant& value)
{
    if (kindOfValue(value) != Kind::Text)
        return value.toDouble() != 0;
    const QString text = textOf(value);
    if (text.size() == 1 && text[0] < u' ')  // a bit that the driver returns as a raw byte
        return text[0] != u'\0';
    if (const std::optional<double> number = numberIn(text))
        return *number != 0;
    if (text.compare(u"true"_s, Qt::CaseInsensitive) == 0 || text.compare(u"false"_s, Qt::CaseInsensitive) == 0)
        return text.size() == 4;
    return text;
}

}  // namespace

Kind kindOfValue(const QVariant& value)
{
    switch (value.typeId()) {
        case QMetaType::Bool:
            return Kind::Flag;
        case QMetaType::Int:
        case QMetaType::UInt:
        case QMetaType::LongLong:
        case QMetaType::ULongLong:
            return Kind::WholeNumber;
        case QMetaType::Double:
        case QMetaType::Float:
            return Kind::Number;
        case QMetaType::QDate:
        case QMetaType::QDateTime:
            return Kind::Date;
        default:
            return Kind::Text;
    }
}

bool isNormal(const QVariant& value, Kind kind)
{
    const int type = value.typeId();
    switch (kind) {
        case Kind::Text:
        case Kind::LongText:
            return type == QMetaType::QString && !value.isNull();
        case Kind::WholeNumber:
            return type == QMetaType::LongLong && !value.isNull();
        case Kind::Number:
            return type == QMetaType::Double && !value.isNull();
        default:
            return false;
    }
}

QVariant normalised(const QVariant& value, Kind kind)
{
    if (value.isNull())
        return {};
    switch (kind) {
        case Kind::Text:
        case Kind::LongText:
            return textOf(value);
        case Kind::WholeNumber:
        case Kind::Number:
            return asNumber(value, kind);
        case Kind::Flag:
            return asFlag(value);
        case Kind::Date:
            return asDate(value);
    }
    return value;
}

QVariant exact(const QVariant& value, const TableColumn& column)
{
    if (value.isNull())
        return {};
    switch (value.typeId()) {
        case QMetaType::Bool:
        case QMetaType::Double:
            return value;
        case QMetaType::QByteArray:
            return column.isText ? QVariant(textOf(value)) : value;
        case QMetaType::QString:
            return column.kind == Kind::Flag ? asFlag(value) : value;  // a bit may be a raw byte
        default:
            return kindOfValue(value) == Kind::WholeNumber ? QVariant(value.toLongLong())
                                                           : normalised(value, column.kind);
    }
}

}  // namespace kest::db

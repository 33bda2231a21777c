#include "platform/database/Criterion.h"

#include "platform/RuntimeError.h"
#include "platform/database/Collation.h"
#include "platform/values.h"

#include <QRegularExpression>

#include <array>
#include <bit>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr qsizetype longestShown = 200;  // the most characters of a criterion in an error message

bool isTextKind(Kind kind)
{
    return kind == Kind::Text || kind == Kind::LongText;
}

/// Returns the number for a value or operand in a number or flag column.
std::optional<double> numberOf(const QVariant& value, Kind kind)
{
    if (value.typeId() != QMetaType::QString)
        return kind == Kind::Flag ? double(value.toDouble() != 0) : value.toDouble();
    const QString text = value.toString().trimmed();
    if (text.isEmpty())
        return 0;
    if (kind != Kind::Flag)
        return numberIn(text);
    if (text.compare(u"true"_s, Qt::CaseInsensitive) == 0 || text.compare(u"false"_s, Qt::CaseInsensitive) == 0)
        return text.size() == 4;
    const std::optional<double> number = numberIn(text);
    return number ? std::optional<double>(*number != 0) : std::nullopt;
}

/// Returns the bytes of a number as a text, which takes a tenth of the time of its digits.
QString bytesOf(double number)
{
    const auto bytes = std::bit_cast<std::array<char16_t, sizeof number / sizeof(char16_t)>>(number);
    return QStringView(bytes).toString();
}

std::optional<QDateTime> dateOf(const QVariant& value)
{
    return value.typeId() == QMetaType::QDateTime ? value.toDateTime() : dateIn(value.toString());
}

template <class T>
std::optional<int> order(const std::optional<T>& left, const std::optional<T>& right)
{
    if (!left || !right)
        return std::nullopt;
    return int(*right < *left) - int(*left < *right);
}

/// Compares the two. The result is negative, zero or positive, or nothing if they can't be compared.
std::optional<int> compared(const QVariant& value, const QString& operand, Kind kind)
{
    if (isTextKind(kind))
        return compareTexts(value.toString(), operand);
    if (kind == Kind::Date)
        return order(dateOf(value), dateOf(operand));
    return order(numberOf(value, kind), numberOf(operand, kind));
}

Criterion::Comparison comparisonOf(const QString& sign)
{
    using enum Criterion::Comparison;
    if (sign == u"="_s)
        return Equal;
    if (sign == u"<>"_s)
        return Unequal;
    if (sign == u"<"_s)
        return Less;
    if (sign == u"<="_s)
        return LessOrEqual;
    if (sign == u">"_s)
        return Greater;
    return sign == u">="_s ? GreaterOrEqual : Like;
}

}  // namespace

bool Criterion::matches(const QVariant& value, Kind kind) const
{
    using enum Comparison;
    if (!operand)
        return comparison == Equal ? value.isNull() : comparison == Unequal && !value.isNull();
    if (value.isNull())
        return false;
    if (comparison == Like)
        return isLike(textOrEmpty(value), QString(*operand).replace(u'*', u'%'));
    const std::optional<int> result = compared(value, *operand, kind);
    if (!result)
        return comparison == Unequal;
    switch (comparison) {
        case Equal:
            return *result == 0;
        case Unequal:
            return *result != 0;
        case Less:
            return *result < 0;
        case LessOrEqual:
            return *result <= 0;
        case Greater:
            return *result > 0;
        default:
            return *result >= 0;
    }
}

QList<Criterion> criteriaIn(const QString& text)
{
    static const QRegularExpression condition(
        uR"(\G\s*(?:\[([^\]]+)\]|(\w+))\s*(=|<>|<=|>=|<|>|LIKE\b)\s*)"
        uR"((?:'((?:[^']++|'')*+)'|#([^#]*)#|([+-]?[0-9.][0-9.eE+-]*)|(NULL|TRUE|FALSE)\b)\s*(AND\b|$))"_s,
        QRegularExpression::CaseInsensitiveOption);
    QList<Criterion> criteria;
    for (qsizetype start = 0; start < text.size();) {
        const QRegularExpressionMatch match = condition.match(text, start);
        if (!match.hasMatch())
            throw RuntimeError(StatementFailed, u"The criterion can't be understood: "_s + text.left(longestShown));
        Criterion criterion;
        criterion.column = match.captured(match.hasCaptured(1) ? 1 : 2);
        criterion.comparison = comparisonOf(match.captured(3));
        if (match.hasCaptured(4))
            criterion.operand = match.captured(4).replace(u"''"_s, u"'"_s);
        else if (match.hasCaptured(5))
            criterion.operand = match.captured(5);
        else if (match.hasCaptured(6))
            criterion.operand = match.captured(6);
        else if (match.captured(7).compare(u"NULL"_s, Qt::CaseInsensitive) != 0)
            criterion.operand = match.captured(7);
        criteria.append(criterion);
        start = match.capturedEnd();
    }
    return criteria;
}

std::optional<QString> equalityKey(const QVariant& value, Kind kind)
{
    if (value.isNull())
        return std::nullopt;
    if (isTextKind(kind))
        return comparisonKey(value.toString());
    if (kind == Kind::Date) {
        const std::optional<QDateTime> date = dateOf(value);
        return date ? std::optional(date->toString(Qt::ISODateWithMs)) : std::nullopt;
    }
    const std::optional<double> number = numberOf(value, kind);
    return number ? std::optional(bytesOf(*number + 0.0)) : std::nullopt;  // never -0
}

}  // namespace kest::db

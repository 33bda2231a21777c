#include "platform/database/Sql.h"

#include "platform/RuntimeError.h"
#include "platform/values.h"

#include <QRegularExpression>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

QString asLiteralText(const QVariant& value)
{
    return textOrEmpty(value).replace(u'\'', u"''"_s);
}

QString asNumber(const QVariant& value)
{
    if (value.isNull())
        return u"NULL"_s;
    switch (value.typeId()) {
        case QMetaType::Bool:
            return value.toBool() ? u"1"_s : u"0"_s;
        case QMetaType::Int:
        case QMetaType::UInt:
        case QMetaType::LongLong:
        case QMetaType::ULongLong:
        case QMetaType::Short:
        case QMetaType::UShort:
            return value.toString();
        case QMetaType::Double:
        case QMetaType::Float:
            return numberText(value.toDouble());
        default:
            break;
    }
    static const QRegularExpression plain(u"\\A[+-]?[0-9]+(\\.[0-9]+)?\\z"_s);
    const QString text = value.toString().trimmed();
    if (plain.match(text).hasMatch())
        return text;
    if (const std::optional<double> number = numberIn(text))
        return numberText(*number);
    throw RuntimeError(TypeMismatch, u"Type mismatch"_s);
}

}  // namespace

QString pasted(const QString& statement, std::initializer_list<QVariant> values)
{
    QString result;
    result.reserve(statement.size() + 32);
    const QVariant* next = values.begin();
    bool insideQuotes = false;
    for (qsizetype i = 0; i < statement.size(); ++i) {
        const QChar c = statement[i];
        if (c == u'{' && i + 1 < statement.size() && statement[i + 1] == u'}' && next != values.end()) {
            result += insideQuotes ? asLiteralText(*next) : asNumber(*next);
            ++next;
            ++i;
            continue;
        }
        if (c == u'\'')
            insideQuotes = !insideQuotes;
        result += c;
    }
    Q_ASSERT_X(next == values.end(), "pasted", "more values than places for them");
    return result;
}

}  // namespace kest::db

namespace kest {

QString likeText(const QString& text)
{
    QString pattern;
    for (const QChar c : text) {
        const bool isWildcard = c == u'[' || c == u'%' || c == u'_';
        pattern += isWildcard ? u'[' + QString(c) + u']' : QString(c);
    }
    return pattern;
}

}  // namespace kest

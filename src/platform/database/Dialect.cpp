#include "platform/database/Dialect.h"

#include "platform/RuntimeError.h"

#include <QDateTime>
#include <QLocale>

#include <algorithm>
#include <cmath>

namespace kest::db {

using namespace Qt::StringLiterals;

QString Dialect::quoted(const QString& identifier) const
{
    if (!identifier.contains(closeQuote))
        return openQuote + identifier + closeQuote;
    QString inner = identifier;
    inner.replace(closeQuote, QString(2, closeQuote));
    return openQuote + inner + closeQuote;
}

QString Dialect::withPrefix(const QString& literal) const
{
    const bool isAscii = std::all_of(literal.begin(), literal.end(), [](QChar c) { return c.unicode() < 0x80; });
    return nationalTexts && !isAscii ? u'N' + literal : literal;
}

QString Dialect::literal(const QVariant& value) const
{
    if (value.isNull())
        return u"NULL"_s;
    switch (value.typeId()) {
        case QMetaType::Bool:
            return value.toBool() ? u"1"_s : u"0"_s;
        case QMetaType::LongLong:
            return QString::number(value.toLongLong());
        case QMetaType::Double:
            if (!std::isfinite(value.toDouble()))
                throw RuntimeError(Overflow, u"Overflow"_s);
            return QString::number(value.toDouble(), 'g', QLocale::FloatingPointShortest);
        case QMetaType::QDateTime: {
            const QDateTime date = value.toDateTime();
            const QString separator = isoDates ? u"T"_s : u" "_s;
            const QString fraction = date.time().msec() == 0 ? QString() : u".zzz"_s;
            return u'\'' + date.toString(u"yyyy-MM-dd"_s) + separator + date.toString(u"HH:mm:ss"_s + fraction) + u'\'';
        }
        case QMetaType::QByteArray:
            return u"X'"_s + QString::fromLatin1(value.toByteArray().toHex()) + u'\'';
        default: {
            QString text = value.toString();
            text.replace(u'\'', u"''"_s);
            if (backslashEscapes)
                text.replace(u'\\', u"\\\\"_s);
            return withPrefix(u'\'' + text + u'\'');
        }
    }
}

QString Dialect::holds(const QString& column, Kind kind, const QVariant& value, int scale) const
{
    constexpr int digitsOfMilliseconds = 3;
    const QString name = quoted(column);
    if (value.isNull())
        return name + u" IS NULL"_s;
    if (kind == Kind::Flag && value.typeId() == QMetaType::Bool)
        return name + (value.toBool() ? u"<>0"_s : u"=0"_s);
    if (kind == Kind::Date && value.typeId() == QMetaType::QDateTime && scale > digitsOfMilliseconds)
        return name + u">="_s + literal(value) + u" AND "_s + name + u'<' + literal(value.toDateTime().addMSecs(1));
    if (kind == Kind::Date && value.typeId() == QMetaType::QDateTime)
        return sameDate.arg(name, literal(value));
    if (kind == Kind::LongText)
        return sameLongText.isEmpty() ? QString() : sameLongText.arg(name, literal(value));
    return name + u'=' + literal(value);
}

const Dialect& embeddedDialect()
{
    static const Dialect dialect{
        .patternSets = true,
        .likeHasNoIndex = true,
        // another tool may have written only the day, or the time after a "T"
        .sameDate = u"datetime(%1)=datetime(%2)"_s,
        .sameLongText = u"%1=%2 COLLATE BINARY"_s,
        .begin = u"BEGIN IMMEDIATE"_s,
    };
    return dialect;
}

static const QString tablesWithoutTransactions =
    u"SELECT TABLE_NAME FROM INFORMATION_SCHEMA.TABLES WHERE TABLE_SCHEMA=DATABASE() AND UPPER(TABLE_NAME) IN "
    "(%1) AND ENGINE IN (SELECT ENGINE FROM INFORMATION_SCHEMA.ENGINES WHERE TRANSACTIONS='NO')"_s;

const Dialect& mySqlDialect()
{
    static const Dialect dialect{
        .caseOfTables = true,
        .openQuote = u'`',
        .closeQuote = u'`',
        .defaultsOnly = u"() VALUES ()"_s,
        .sameLongText = u"CONVERT(%1 USING utf8mb4)=%2 COLLATE utf8mb4_bin"_s,
        .lockedEnd = u" FOR UPDATE"_s,
        .sessionNumber = u"SELECT CONNECTION_ID()"_s,
        .withoutTransactions = tablesWithoutTransactions,
        .exactDate = u"CAST(%1 AS CHAR)"_s,
        .exactDecimal = u"CAST(%1 AS CHAR)"_s,
        .exactSingle = u"%1+0e0"_s,
    };
    return dialect;
}

const Dialect& mySqlOverOdbcDialect()
{
    static const Dialect dialect = [] {
        Dialect other = mySqlDialect();
        other.backslashEscapes = true;
        other.sameLongText.clear();
        return other;
    }();
    return dialect;
}

const Dialect& sqlServerDialect()
{
    static const Dialect dialect{
        .top = true,
        .plusJoinsTexts = true,
        .patternSets = true,
        .isoDates = true,
        .nationalTexts = true,
        .openQuote = u'[',
        .closeQuote = u']',
        .begin = u"BEGIN TRANSACTION"_s,
        .rollback = u"IF @@TRANCOUNT > 0 ROLLBACK"_s,
        .lockedTable = u"%1 WITH (UPDLOCK, HOLDLOCK)"_s,
        .sessionNumber = u"SELECT @@SPID"_s,
        .identityInsert = u"SET IDENTITY_INSERT %1 "_s,
    };
    return dialect;
}

}  // namespace kest::db

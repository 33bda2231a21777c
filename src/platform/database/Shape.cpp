#include "platform/database/Shape.h"

#include "platform/database/Tokens.h"

namespace kest::db {

namespace {

/// Returns true if a number that follows this text is a value, and not for example the position in an ORDER BY.
bool expectsNumber(QChar last, bool isInsert)
{
    return last == u'=' || last == u'<' || last == u'>' || (isInsert && (last == u'(' || last == u','));
}

bool isPartOfWord(QChar c)
{
    return c.isLetterOrNumber() || c == u'_' || c == u'.';
}

/// Returns the index after the digits and the point of a plain number, or its start if it has an exponent.
qsizetype endOfNumber(QStringView statement, qsizetype start)
{
    qsizetype end = start;
    for (int points = 0; end < statement.size(); ++end) {
        const char16_t c = statement[end].unicode();
        if (c == u'.' && points++ == 0)
            continue;
        if (c < u'0' || c > u'9')
            break;
    }
    return end < statement.size() && isPartOfWord(statement[end]) ? start : end;
}

bool isPattern(QStringView before)
{
    return before.trimmed().endsWith(u"LIKE", Qt::CaseInsensitive);
}

Shape shapeOf(const QString& statement, bool takesPatterns, QStringView literalMark, QStringView numberMark)
{
    Shape shape;
    shape.text.reserve(statement.size());
    const bool isInsert = QStringView(statement).trimmed().startsWith(u"INSERT", Qt::CaseInsensitive);
    const QStringView whole(statement);
    qsizetype kept = 0;  // the text before it is in the shape
    QChar last;          // the last character that is not blank
    const auto take = [&](qsizetype start, qsizetype end, QStringView mark) {
        shape.text += whole.sliced(kept, start - kept);
        shape.text += mark;
        shape.values.append(statement.sliced(start, end - start));
        kept = end;
    };
    for (qsizetype i = 0; i < whole.size();) {
        const QChar c = whole[i];
        qsizetype end = i + 1;
        if (c == u'\'') {
            end = endOfQuoted(statement, i, c);
            if (takesPatterns || !isPattern(whole.first(i)))
                take(i, end, literalMark);
        } else if (c == u'"' || c == u'`' || c == u'[') {
            end = endOfQuoted(statement, i, c == u'[' ? u']' : c);
        } else if (c >= u'0' && c <= u'9' && expectsNumber(last, isInsert) && endOfNumber(whole, i) > i) {
            end = endOfNumber(whole, i);
            take(i, end, numberMark);
        }
        if (c != u' ')
            last = c;
        i = end;
    }
    shape.text += whole.sliced(kept);
    return shape;
}

}  // namespace

Shape Shape::toTranslate(const QString& statement)
{
    return shapeOf(statement, false, literalMark, numberMark);
}

Shape Shape::toPrepare(const QString& statement)
{
    return shapeOf(statement, true, u"?", u"?");
}

}  // namespace kest::db

#include "platform/database/Collation.h"

#include "platform/wildcards.h"

namespace kest::db {

namespace {

QStringView withoutTrailingBlanks(QStringView text)
{
    while (text.endsWith(u' '))
        text.chop(1);
    return text;
}

/// Folds character by character, like compareTexts(), so that the text keeps its length.
QString caseFolded(QStringView text)
{
    QString folded = text.toString();
    for (QChar& c : folded)
        c = c.toCaseFolded();
    return folded;
}

/// Returns true if a character matches the set between brackets.
bool isInSet(char16_t c, QStringView set)
{
    const bool excludes = set.startsWith(u'^');
    if (excludes)
        set = set.sliced(1);
    bool found = false;
    for (qsizetype i = 0; i < set.size(); ++i) {
        const bool range = i + 2 < set.size() && set[i + 1] == u'-';
        const char16_t last = set[range ? i + 2 : i].unicode();
        found = found || (c >= set[i].unicode() && c <= last);
        if (range)
            i += 2;
    }
    return found != excludes;
}

/// Returns the length of the pattern's first element, which is a set in brackets or a character.
qsizetype elementLength(QStringView pattern)
{
    const qsizetype close = pattern.startsWith(u'[') ? pattern.indexOf(u']', 1) : -1;
    return close < 0 ? 1 : close + 1;
}

bool elementMatches(QStringView element, QChar c)
{
    if (element.size() > 1)
        return isInSet(c.unicode(), element.sliced(1, element.size() - 2));
    return element[0] == u'_' || element[0] == c;
}

}  // namespace

QString comparisonKey(QStringView text)
{
    return caseFolded(withoutTrailingBlanks(text));
}

int compareTexts(QStringView left, QStringView right)
{
    return withoutTrailingBlanks(left).compare(withoutTrailingBlanks(right), Qt::CaseInsensitive);
}

bool isLike(QStringView rawText, QStringView rawPattern)
{
    // "%a %" must find "a ", so a "%" at the end needs the trailing blanks
    const QString foldedText = rawPattern.endsWith(u'%') ? caseFolded(rawText) : comparisonKey(rawText);
    const QString foldedPattern = comparisonKey(rawPattern);
    return matchesWildcards(foldedText, foldedPattern, u'%', elementLength, elementMatches);
}

}  // namespace kest::db

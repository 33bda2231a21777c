#include "base/Helpers.h"

#include "base/QuoteKey.h"
#include "platform/values.h"

#include <algorithm>
#include <iterator>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

QString onlyCharacters(const QString& text, bool (*keeps)(QChar))
{
    QString kept;
    std::copy_if(text.begin(), text.end(), std::back_inserter(kept), keeps);
    return kept;
}

bool isDigit(QChar c)
{
    return c >= u'0' && c <= u'9';
}

}  // namespace

QString ReplaceText(const QString& text, const QString& replacement, const QString& search)
{
    if (search.isEmpty())
        return text;
    return QString(text).replace(search, replacement, Qt::CaseInsensitive);
}

QString PadZeroLeft(const QString& text, int length)
{
    return text.rightJustified(length, u'0');
}

double SafeVal(const QString& text, const QString& fallback)
{
    if (const auto number = numberIn(text))
        return *number;
    const QString digits = onlyCharacters(text, [](QChar c) { return isDigit(c) || c == u'.'; });
    if (const auto number = numberIn(digits))
        return *number;
    return numberIn(fallback).value_or(0);
}

QString NormaliseRego(const QString& rego)
{
    const QString upper = rego.trimmed().toUpper();
    if (upper.isEmpty() || upper == "TBA"_L1 || upper == "UNIVERSAL"_L1 || upper == "ADVISE"_L1)
        return u"UNIVERSAL"_s;
    return rego;
}

QString NormaliseQuoteRef(const QString& reference)
{
    return QuoteKey::fromReference(reference).reference();
}

std::pair<QString, QString> SplitQuoteRef(const QString& reference)
{
    const qsizetype slash = reference.indexOf(u'/');
    if (slash < 0)
        return {reference, u"0"_s};
    return {reference.first(slash), reference.sliced(slash + 1)};
}

bool isBlank(const QString& text)
{
    return text.trimmed().isEmpty();
}

QString trimBlanks(const QString& text)
{
    qsizetype from = 0;
    qsizetype to = text.size();
    while (from < to && text[from] == u' ')
        ++from;
    while (to > from && text[to - 1] == u' ')
        --to;
    return text.sliced(from, to - from);
}

QString AlphaNumericOnly(const QString& text)
{
    return onlyCharacters(text,
                          [](QChar c) { return isDigit(c) || (c >= u'a' && c <= u'z') || (c >= u'A' && c <= u'Z'); });
}

QString GetExtensionUpper(const QString& fileName)
{
    const qsizetype dot = fileName.lastIndexOf(u'.');
    return dot < 0 ? QString() : fileName.sliced(dot + 1).trimmed().toUpper();
}

QString FormatNetworkDate(const QString& text)
{
    constexpr qsizetype fractionAndZone = 5;  // characters: ".000Z"
    if (text.isEmpty())
        return {};
    QString written = text;
    written.replace(u'T', u' ');
    written.chop(fractionAndZone);
    const QDateTime local = UtcToLocal(toDate(written));
    const int hour = local.time().hour();
    return QString::asprintf("%d/%d/%04d %d:%02d %s", local.date().day(), local.date().month(), local.date().year(),
                             hour % 12 == 0 ? 12 : hour % 12, local.time().minute(), hour < 12 ? "AM" : "PM");
}

QDateTime UtcToLocal(const QDateTime& universal)
{
    const QTime time = universal.time();
    return QDateTime(universal.date(), QTime(time.hour(), time.minute(), time.second()), Qt::UTC).toLocalTime();
}

}  // namespace kest

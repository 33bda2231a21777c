#include "jobexport/Address.h"

#include "base/Helpers.h"
#include "platform/values.h"

namespace kest::joblink {

using namespace Qt::StringLiterals;

namespace {

bool endsInPostcode(const QString& suburb)
{
    if (!suburb.contains(u' '))
        return false;
    const QString word = suburb.mid(suburb.lastIndexOf(u' ') + 1);
    return numberIn(word) == SafeVal(word, u"0"_s);
}

}  // namespace

QString composedAddress(const QString& street, const QString& suburb)
{
    const QString start = street.isEmpty() ? QString() : street + u", "_s;
    return start + (endsInPostcode(suburb) ? suburb.left(suburb.lastIndexOf(u' ')).trimmed() : suburb);
}

QString postcode(const QString& suburb)
{
    return endsInPostcode(suburb) ? suburb.mid(suburb.lastIndexOf(u' ') + 1).trimmed() : QString();
}

BuildDate buildDate(const QVariant& year)
{
    const QString text = textOrEmpty(year);
    if (text.isEmpty())
        return {};
    const qsizetype slash = text.indexOf(u'/');
    if (slash < 0)
        return {.month = {}, .year = text};
    return {.month = text.left(slash), .year = text.mid(slash + 1)};
}

}  // namespace kest::joblink

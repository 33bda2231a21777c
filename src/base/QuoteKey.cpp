#include "base/QuoteKey.h"

#include "base/Helpers.h"
#include "platform/database/Recordset.h"
#include "platform/values.h"

namespace kest {

using namespace Qt::StringLiterals;

QuoteKey QuoteKey::fromReference(const QString& reference)
{
    const auto [number, subquote] = SplitQuoteRef(reference);
    return {number, subquote};
}

QuoteKey QuoteKey::fromRow(const db::Recordset& row)
{
    return {row.text(u"QTNNO"_s), row.text(u"Subquote"_s)};
}

QuoteKey QuoteKey::fromResponseName(const QString& fileName)
{
    return {fileName.section(u'_', 1, 1), fileName.section(u'_', 2).left(1)};
}

QString QuoteKey::reference() const
{
    return leadingNumber(subquote) > 0 ? fullReference() : number;
}

bool QuoteKey::begins(const QString& fileName) const
{
    return fileName.startsWith(number, Qt::CaseInsensitive) &&
           fileName.mid(number.size() + 1, subquote.size()) == subquote;
}

}  // namespace kest

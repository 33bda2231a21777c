#include "quotedata/Quote.h"

#include "base/modDBAccess.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

db::Recordset& openedOnce(std::optional<db::Recordset>& rows, db::Recordset (*open)(const QuoteKey&),
                          const QuoteKey& key)
{
    if (!rows)
        rows = open(key);
    return *rows;
}

}  // namespace

Quote::Quote(QuoteKey key) : quoteKey(std::move(key)) {}

Quote::Quote(db::Recordset header) : headerRow(std::move(header))
{
    if (!headerRow->eof())
        quoteKey = QuoteKey::fromRow(*headerRow);
}

Quote::Quote(QuoteKey key, db::Recordset header) : quoteKey(std::move(key)), headerRow(std::move(header)) {}

bool Quote::isSupplementary()
{
    return toLong(header().value(u"Subquote"_s)) > 0;
}

db::Recordset& Quote::header()
{
    return openedOnce(headerRow, openHeader, quoteKey);
}

db::Recordset& Quote::lines()
{
    return openedOnce(lineRows, openLines, quoteKey);
}

db::Recordset& Quote::notes()
{
    return openedOnce(noteRow, openNotes, quoteKey);
}

QString Quote::headerQuery(const QuoteKey& key)
{
    return sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}'", key.number, key.subquote);
}

db::Recordset Quote::openNumbered(const QString& number, const QString& select)
{
    return opened(number.trimmed().isEmpty() ? sql("SELECT * FROM QUOTE1 WHERE rec_id=0") : select);
}

db::Recordset Quote::openHeader(const QuoteKey& key)
{
    return opened(headerQuery(key));
}

db::Recordset Quote::openLines(const QuoteKey& key)
{
    return opened(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}'", key.number, key.subquote));
}

db::Recordset Quote::openNotes(const QuoteKey& key)
{
    return opened(sql("SELECT * FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE='{}'", key.number, key.subquote));
}

}  // namespace kest

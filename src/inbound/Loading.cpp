#include "inbound/Loading.h"

#include "base/QuoteKey.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

namespace kest {

using namespace Qt::StringLiterals;

void setColumns(db::Recordset& row, std::initializer_list<ColumnValue> columns)
{
    for (const ColumnValue& column : columns)
        row.set(column.name, column.value);
}

void fillWithoutTotals(db::Recordset& quote)
{
    for (const char16_t* column : {u"RR_TOTAL", u"RA_TOTAL", u"PAINT_TOTAL", u"TOTAL", u"PRTTOTAL", u"MISTOTAL",
                                   u"override", u"rr_override", u"ra_override", u"paint_override", u"CONTACTID"})
        quote.set(QString::fromUtf16(column), 0);
    setColumns(quote, {{"quotechanged"_L1, true}, {"invoiced"_L1, false}});
}

void respellColour(db::Recordset& car, db::Recordset& colours)
{
    const QString colour = car.text(u"COLOUR"_s);
    if (colour.isEmpty())
        return;
    colours.find(sql("Script='{}'", colour));
    car.set(u"COLOUR"_s, colours.eof() ? u""_s : colours.text(u"Script"_s).trimmed());
}

void tellOldTotals(const db::Recordset& quote)
{
    const bool isOpen = gConn->state() == 1;  // it may get lost while the box is open
    desktop::msgBox(
        u"The lines of quote %1 are loaded, but its totals could not be stored. Open the quote in the "
        "estimating program and save it there, so that its totals are calculated again."_s.arg(
            QuoteKey::fromRow(quote).reference()),
        desktop::Icon::Exclamation);
    if (isOpen)  // otherwise it was lost before, and the load fails and is repeated
        EnsureConnection();
}

bool refuse(const QString& text)
{
    desktop::msgBox(text, desktop::Icon::Critical);
    return false;
}

}  // namespace kest

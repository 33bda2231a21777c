#include "quotedata/QuoteTotals.h"

#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/values.h"
#include "quotedata/Quote.h"
#include "quotedata/Rounding.h"

#include <functional>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

enum class EmptyHours { CountAsZero, Fail };

struct SectionTotals {
    double removeAndReplace = 0;
    double repair = 0;
    double paint = 0;
    double otherPaint = 0;
    double parts = 0;
    double miscellaneous = 0;
    double inOrder = 0;  // all labour and paint, added in the order of the lines

    double labour() const { return removeAndReplace + repair + paint + otherPaint; }
};

/// Returns true if the line is not deleted and no other line names it as the line that it replaces. `lines` keeps its
/// position, even if another line has the same key: the loop over the lines must move on.
bool counts(db::Recordset& lines)
{
    const qint64 id = toLong(lines.value(u"itemid"_s));
    const int position = lines.absolutePosition();
    lines.moveFirst();
    lines.find(u"deleteditem"_s, id);
    const bool replaced = !lines.eof();
    lines.setAbsolutePosition(position);
    const QVariant deleted = lines.value(u"delitem"_s);
    return !replaced && !deleted.isNull() && !toBool(deleted);
}

bool isZero(const QVariant& value)
{
    return !value.isNull() && toDouble(value) == 0;
}

bool isReportItem(const db::Recordset& line)
{
    return isTrue(line.value(u"Report_on"_s));
}

/// Returns the rounded product. If one factor is 0, the other may be Null.
double amount(const db::Recordset& line, const QVariant& factor, const QVariant& hours)
{
    if (isZero(hours) || isZero(factor) || isReportItem(line))
        return 0;
    return RoundAmount(toDouble(factor) * toDouble(hours), 2);
}

void addLine(SectionTotals& totals, const db::Recordset& line, EmptyHours emptyHours)
{
    const auto hours = [&](const QString& column) {
        const QVariant value = line.value(column);
        return value.isNull() && emptyHours == EmptyHours::CountAsZero ? QVariant(0.0) : value;
    };
    const auto addLabour = [&](double& section, double amount) {
        section += amount;
        totals.inOrder += amount;
    };
    const QString category = line.text(u"category"_s);
    if (category == "PRT"_L1)
        totals.parts += amount(line, line.value(u"qty"_s), hours(u"rrhour"_s));  // for a part, rrhour is the unit price
    else if (category == "R&R"_L1)
        addLabour(totals.removeAndReplace, amount(line, line.value(u"rr_rate2"_s), hours(u"rrhour"_s)));
    else if (category == "RA"_L1)
        addLabour(totals.repair, amount(line, line.value(u"rr_rate2"_s), hours(u"rahour"_s)));
    else if (category == "PAINT"_L1)
        addLabour(totals.paint, amount(line, line.value(u"rr_rate2"_s), hours(u"pthour"_s)));
    else if (category == "OPG"_L1)
        addLabour(totals.otherPaint, amount(line, line.value(u"opg_rate"_s), hours(u"pthour"_s)));
    else if (category == "MIS"_L1 && !isReportItem(line))
        totals.miscellaneous += toDouble(line.value(u"unitcost"_s));
}

/// Names the line in the reason if the step fails.
void ofLine(const db::Recordset& line, const QString& what, const std::function<void()>& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        throw RuntimeError(error.number(),
                           u"%1: %2 of the quote line \"%3\""_s.arg(error.description(), what, line.text(u"script"_s)));
    }
}

/// Adds up the lines from the current one to the last.
SectionTotals totalsOf(db::Recordset& lines, EmptyHours emptyHours)
{
    SectionTotals totals;
    for (; !lines.eof(); lines.moveNext())
        ofLine(lines, u"amount"_s, [&] {
            if (counts(lines))
                addLine(totals, lines, emptyHours);
        });
    return totals;
}

/// Stores the totals that `set` puts into the quote. Returns false if this fails; the reason is in the error log.
bool storeTotals(db::Recordset& quote, const std::function<void()>& set)
{
    const bool stored = attempt([&] {
        try {
            set();
            quote.set(u"quotechanged"_s, true);
            quote.update();
        } catch (const RuntimeError& error) {
            attempt([&] { logFailure(error, u"QuoteTotals.storeTotals"_s); });
            throw;
        }
    });
    if (!stored)
        quote.cancelUpdate();  // totals that could not be stored must not go with a later change
    return stored;
}

}  // namespace

bool CalcQuoteTotals(db::Recordset& quote, db::Recordset& lines)
{
    return storeTotals(quote, [&] {
        if (lines.recordCount() > 0)
            lines.moveFirst();
        const SectionTotals totals = totalsOf(lines, EmptyHours::CountAsZero);
        quote.set(u"TOTAL"_s, totals.labour());
        quote.set(u"PRTTOTAL"_s, totals.parts);
        quote.set(u"MISTOTAL"_s, totals.miscellaneous);
        quote.set(u"RR_TOTAL"_s, totals.removeAndReplace);
        quote.set(u"RA_TOTAL"_s, totals.repair);
        quote.set(u"PAINT_TOTAL"_s, totals.paint);
    });
}

bool CalcAuthorisedTotals(db::Recordset& quote, db::Recordset& lines)
{
    return storeTotals(quote, [&] {
        if (!lines.eof())
            lines.moveFirst();
        const SectionTotals totals = totalsOf(lines, EmptyHours::Fail);
        quote.set(u"TOTAL"_s, totals.inOrder);
        quote.set(u"PRTTOTAL"_s, totals.parts);
        quote.set(u"MISTOTAL"_s, totals.miscellaneous);
    });
}

bool RoundQuoteLines(db::Recordset& quote)
{
    db::Recordset lines = Quote::openLines(QuoteKey::fromRow(quote));
    bool isChanged = false;
    for (; !lines.eof(); lines.moveNext()) {
        for (const auto& column : {u"unitcost"_s, u"rrhour"_s, u"rahour"_s, u"pthour"_s}) {
            if (lines.text(column).isEmpty())
                continue;
            const QVariant given = lines.value(column);
            ofLine(lines, column, [&] { lines.set(column, RoundAmount(toDouble(given), 2)); });
            isChanged = isChanged || lines.value(column) != given;
        }
        lines.update();
    }
    if (isChanged)
        lines.requery();  // the database may store another value than it gets
    return CalcQuoteTotals(quote, lines);
}

}  // namespace kest

// Compares the totals of made-up quotes with a calculation in whole cents.
#include "quotedata/QuoteTotals.h"
#include "support/Chance.h"
#include "support/Shop.h"

/// Returns the product of two hundredths in cents, rounded half away from zero.
static qint64 cents(qint64 a, qint64 b)
{
    const qint64 product = a * b;
    return (product + (product < 0 ? -50 : 50)) / 100;
}

/// The lines of the quote 500, and what they add up to.
class MadeUpLines {
public:
    explicit MadeUpLines(quint32 seed) : chance(seed)
    {
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        for (int number = chance.number(0, 12); number > 0; --number)
            add();
    }

    /// Returns the total of a category in cents.
    qint64 sum(const QString& category) const { return sums.value(category); }

private:
    void add()
    {
        const QString category =
            chance.one({u"PRT"_s, u"R&R"_s, u"RA"_s, u"PAINT"_s, u"OPG"_s, u"MIS"_s, u"mis"_s, u"prt"_s, u"XYZ"_s});
        const int unit = chance.once(3) ? 25 : 1;  // the binary values of quarters are exact
        const int factor = unit * chance.number(-500 / unit, 20'000 / unit);
        int hours = unit * chance.number(-20'000 / unit, 90'000 / unit);
        if (unit == 1 && std::abs(qint64(factor) * hours % 100) == 50)
            ++hours;  // half a cent is rounded as its binary value is, which no decimal calculation knows
        const bool isReported = chance.once(6);
        const bool replaces = counted.has_value() && chance.once(5);
        const QVariant deleted = chance.once(8) ? QVariant() : QVariant(chance.once(8));
        lines.addNew();
        lines.set(u"QTNNO"_s, u"500"_s);
        lines.set(u"Subquote"_s, 0);
        lines.set(u"category"_s, category);
        for (const auto& column : {u"qty"_s, u"rr_rate2"_s, u"opg_rate"_s})
            lines.set(column, factor / 100.0);
        for (const auto& column : {u"rrhour"_s, u"rahour"_s, u"pthour"_s, u"unitcost"_s})
            lines.set(column, hours / 100.0);
        lines.set(u"Report_on"_s, isReported);
        lines.set(u"delitem"_s, deleted);
        if (replaces)
            lines.set(u"DELETEDITEM"_s, counted->id);
        lines.update();
        if (replaces)
            sums[counted->category] -= counted->amount;
        const bool counts = !isReported && !deleted.isNull() && !deleted.toBool();
        const qint64 amount = !counts ? 0 : category == u"MIS"_s ? hours : cents(factor, hours);
        sums[category] += amount;
        counted = {category, amount, lines.value(u"itemid"_s)};
    }

    struct Counted {
        QString category;
        qint64 amount;
        QVariant id;
    };
    Chance chance;
    QMap<QString, qint64> sums;
    std::optional<Counted> counted;  // the last line
    db::Recordset lines = opened(u"SELECT * FROM QUOTE2 WHERE 1=0"_s);
};

using DecimalTotals = Shop;

TEST_F(DecimalTotals, AreTheSumsOfTheLinesInCents)
{
    quote("500");
    for (quint32 seed = 0; seed < 60; ++seed) {
        const MadeUpLines made(seed);
        const qint64 labour = made.sum(u"R&R"_s) + made.sum(u"RA"_s) + made.sum(u"PAINT"_s) + made.sum(u"OPG"_s);
        for (const auto& routine : {&CalcQuoteTotals, &CalcAuthorisedTotals}) {
            gConn->execute(u"UPDATE QUOTE1 SET TOTAL=-1, PRTTOTAL=-1, MISTOTAL=-1"_s);
            db::Recordset header = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
            db::Recordset lines = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
            EXPECT_TRUE(routine(header, lines));
            const std::pair<const char*, qint64> totals[] = {
                {"TOTAL", labour}, {"PRTTOTAL", made.sum(u"PRT"_s)}, {"MISTOTAL", made.sum(u"MIS"_s)}};
            for (const auto& [column, expected] : totals)
                EXPECT_NEAR(quote("500").number(column), double(expected) / 100, 1e-6) << column << ", seed " << seed;
        }
    }
}

// Compares the totals of made-up quotes with a calculation in whole cents.
#include "quotedata/QuoteTotals.h"
#include "support/Chance.h"
#include "support/Shop.h"

using DecimalTotals = Shop;

/// Returns the total of a category in cents. A line's amount is rounded half away from zero.
static qint64 cents(const char* category, const char* factor, const char* hours)
{
    qint64 sum = 0;
    for (const QSqlRecord& line : plainRows(
             u"SELECT * FROM QUOTE2 WHERE delitem=0 AND Report_on=0 AND itemid NOT IN (SELECT DELETEDITEM FROM QUOTE2 "
             "WHERE DELETEDITEM IS NOT NULL)"_s)) {
        const auto hundredths = [&](const char* column) {
            return qRound64(line.value(QString::fromLatin1(column)).toDouble() * 100);
        };
        const qint64 product = hundredths(hours) * (*factor ? hundredths(factor) : 100);
        if (line.value(u"category"_s) == QLatin1StringView(category))
            sum += (product + (product < 0 ? -50 : 50)) / 100;
    }
    return sum;
}

TEST_F(DecimalTotals, AreTheSumsOfTheLinesInCents)
{
    const Grammar lines("quotedata/made-up-lines.txt");
    quote("500");
    for (quint32 seed = 0; seed < 60; ++seed) {
        Chance chance(seed);
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        for (int number = 1, last = chance.number(0, 12); number <= last; ++number) {
            const QVariant before = plainRows(u"SELECT MAX(itemid) FROM QUOTE2"_s)[0].value(0);
            const QVariant replaced = chance.once(5) ? before : QVariant();
            addRow("QUOTE2", {{"QTNNO", "500"}, {"Subquote", 0}, {"SEQ_NO", number}, {"DELETEDITEM", replaced}},
                   lines.text(chance, u"line"_s));
        }
        const qint64 replacing = cents("R&R", "rr_rate2", "rrhour");
        const qint64 repair = cents("RA", "rr_rate2", "rahour");
        const qint64 paint = cents("PAINT", "rr_rate2", "pthour");
        const std::pair<const char*, qint64> totals[] = {
            {"TOTAL", replacing + repair + paint + cents("OPG", "opg_rate", "pthour")},
            {"PRTTOTAL", cents("PRT", "qty", "rrhour")},
            {"MISTOTAL", cents("MIS", "", "unitcost")},
            {"RR_TOTAL", replacing},
            {"RA_TOTAL", repair},
            {"PAINT_TOTAL", paint}};
        for (const auto& routine : {&CalcQuoteTotals, &CalcAuthorisedTotals}) {
            gConn->execute(
                u"UPDATE QUOTE1 SET TOTAL=-1, PRTTOTAL=-1, MISTOTAL=-1, RR_TOTAL=-1, RA_TOTAL=-1, PAINT_TOTAL=-1, "
                "quotechanged=0"_s);
            db::Recordset header = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
            db::Recordset rows = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
            EXPECT_TRUE(routine(header, rows));
            for (const auto& [column, sum] : totals) {
                const bool stays = routine == &CalcAuthorisedTotals && QLatin1StringView(column).endsWith("_TOTAL"_L1);
                EXPECT_NEAR(quote("500").number(column), stays ? -1 : double(sum) / 100, 1e-6) << column << seed;
            }
            EXPECT_EQ(quote("500").number("quotechanged"), 1);
        }
    }
}

// Measures a send against the plain statements that it needs and the serialisation of the same tree. Also measures the
// totals.
#include "BenchShop.h"
#include "InTurn.h"
#include "PlainStatements.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "outbound/SendQuote.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"
#include "quotedata/QuoteTotals.h"

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

class SaysYes final : public desktop::Answerer {
    desktop::Answer box(const desktop::Box& box) override { return box.defaultAnswer; }
    QString input(const desktop::Input&) override { return {}; }
    void start(const QString&) override {}
};

/// Adds the quote 1, which has `lines` lines of every kind.
void addQuote(int64_t lines)
{
    runPlain(u"INSERT INTO ALLMODEL (MODEL_ID, MAKE, MODEL) VALUES ('C120', 'CORELLA', 'MERIDIAN GL')"_s);
    runPlain(u"INSERT INTO CUSTOMER (CUST_ID, NAME, FIRSTNAME, SALUTATION) VALUES (1, 'Holloway', 'Kim', 'Ms')"_s);
    runPlain(
        u"INSERT INTO CAR (REGO, CUST_ID, MODEL_ID, BODY_ID2, Year, XMission, COLOUR) "
        "VALUES ('ABC123', 1, 'C120', '4S', '03/2005', 'Manual', 'Silver')"_s);
    runPlain(
        u"INSERT INTO QUOTE1 (QTNNO, Subquote, REGO, INSURER_ID, Claim, ReadOnly) "
        "VALUES ('1', 0, 'ABC123', 1, '7700001', 0)"_s);
    runPlain(u"INSERT INTO QUOTE3 (QTNNO, Subquote, remarks) VALUES ('1', 0, '')"_s);
    const char* categories[] = {"R&R", "RA", "PAINT", "PRT", "MIS"};
    runPlain(u"BEGIN"_s);
    for (int64_t i = 0; i < lines; ++i)
        runPlain(
            sql("INSERT INTO QUOTE2 (QTNNO, Subquote, category, script, rrhour, rahour, pthour, rr_rate2, qty, "
                "unitcost, PartNo, MARK) VALUES ('1', 0, '{}', 'Left front guard {}', 1.25, 1.5, 2, 38.5, 1, 20.5, "
                "'P{}', '')",
                QString::fromLatin1(categories[i % 5]), static_cast<qint64>(i), static_cast<qint64>(i)));
    runPlain(u"COMMIT"_s);
}

/// Restores the state before the first send: no line has a number.
void takeBack()
{
    runPlain(u"UPDATE QUOTE1 SET ReadOnly=0, Job_stage=1, quotechanged=0 WHERE QTNNO='1'"_s);
    runPlain(u"UPDATE QUOTE2 SET SEQ_NO=NULL WHERE QTNNO='1'"_s);
    runPlain(u"UPDATE QUOTE3 SET remarks='' WHERE QTNNO='1'"_s);
}

void bareStatements(int64_t lines)
{
    const QString ofQuote = u" WHERE QTNNO='1' AND SUBQUOTE=0"_s;
    for (int i = 0; i < 3; ++i)
        runPlain(u"SELECT * FROM QUOTE1"_s + ofQuote);
    for (int i = 0; i < 2; ++i) {
        runPlain(u"SELECT * FROM CUSTOMER WHERE CUST_ID=1"_s);
        runPlain(u"SELECT * FROM CAR WHERE REGO='ABC123'"_s);
        runPlain(u"SELECT * FROM ALLMODEL WHERE MODEL_ID='C120'"_s);
        runPlain(u"SELECT * FROM QUOTE3"_s + ofQuote);
        runPlain(u"SELECT * FROM QUOTE2"_s + ofQuote);  // once for rounding, once for the totals
    }
    runPlain(u"SELECT NAME, KEST FROM INSURER WHERE INSURER_ID=1"_s);
    runPlain(u"SELECT * FROM QUOTE2 WHERE QTNNO='1' AND SUBQUOTE=0 AND CATEGORY='PRT' AND QTY=0"_s);
    for (const char* set :
         {"CATEGORY='R&R' AND PARTNO <> 'M'", "CATEGORY='RA'", "CATEGORY='R&R' AND PARTNO='M'", "CATEGORY='MIS'",
          "CATEGORY='PRT'", "CATEGORY='PAINT'", "CATEGORY='OPG'", "CATEGORY='MIS' AND VENDOR>0", "REPORT_ON=1"})
        runPlain(u"SELECT ITEMID, PARTNO, SCRIPT, RRHOUR, RR_RATE2, SEQ_NO FROM QUOTE2"_s + ofQuote + u" AND "_s +
                 QString::fromLatin1(set));
    for (int64_t i = 1; i <= lines; ++i)
        runPlain(u"UPDATE QUOTE2 SET SEQ_NO=%1 WHERE itemid=%1"_s.arg(i));
    runPlain(u"UPDATE QUOTE1 SET TOTAL=1, PRTTOTAL=1, quotechanged=1 WHERE QTNNO='1'"_s);
    runPlain(u"UPDATE QUOTE1 SET Job_stage=3, ReadOnly=1 WHERE QTNNO='1'"_s);
    runPlain(u"UPDATE QUOTE3 SET remarks='(22/11/2026 : Sending KEST Quote)' WHERE QTNNO='1'"_s);
}

void sendQuote(benchmark::State& state)
{
    const int64_t lines = state.range(0);
    const BenchShop shop;
    addQuote(lines);
    desktop::setAnswerer(std::make_shared<SaysYes>());
    db::Recordset panel(gConn);
    panel.open(u"SELECT * FROM QUOTE1 WHERE QTNNO='1'"_s);
    InTurn times(state);
    for (auto _ : state) {
        takeBack();
        double total = 0;
        times.operation([&] { total = SendQuote(panel); });
        if (total == 0)
            state.SkipWithError("the quote was not sent");

        takeBack();
        const QString document = files::read(gsUnsentPath + u"1.0_1.xml"_s);
        xml::Document tree;
        tree.loadXML(u"<request>"_s + document + u"</request>"_s);
        times.floor([&] {
            bareStatements(lines);
            files::write(gsUnsentPath + u"floor.txt"_s, tree.xml());
        });
    }
}
BENCHMARK(sendQuote)->Arg(10)->Arg(100)->Iterations(20)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(sendQuote)->Arg(1000)->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);

void calcTotals(benchmark::State& state)
{
    const BenchShop shop;
    addQuote(state.range(0));
    db::Recordset quote(gConn);
    quote.open(u"SELECT * FROM QUOTE1 WHERE QTNNO='1'"_s);
    db::Recordset lines(gConn);
    lines.open(u"SELECT * FROM QUOTE2 WHERE QTNNO='1'"_s);
    for (auto _ : state)
        CalcQuoteTotals(quote, lines);
    state.SetComplexityN(state.range(0));
    state.counters["lines_per_second"] =
        benchmark::Counter(static_cast<double>(state.range(0)), benchmark::Counter::kIsIterationInvariantRate);
}
BENCHMARK(calcTotals)->RangeMultiplier(10)->Range(10, 10000)->Unit(benchmark::kMillisecond)->Complexity();

}  // namespace
}  // namespace kest

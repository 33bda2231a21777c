// Measures loads of authorised and manual quotes with many lines against the plain statements of the same load.
#include "BenchShop.h"
#include "InTurn.h"
#include "PlainStatements.h"
#include "base/SharedVariables.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr const char* categories[] = {"R&R", "RA", "MIS"};
constexpr const char* labourTypes[] = {"RR", "REPR", "OTH"};

/// Adds the quotes 1 and 2, each with `lines` labour lines: one for the load, one for the plain statements.
void addQuotes(int64_t lines)
{
    runPlain(u"INSERT INTO CAR (REGO, CUST_ID, KEST) VALUES ('ABC123', 1, 1)"_s);
    runPlain(u"BEGIN"_s);
    for (const int quote : {1, 2}) {
        runPlain(
            sql("INSERT INTO QUOTE1 (QTNNO, Subquote, REGO, INSURER_ID, KESTQRNo, excess, contri) "
                "VALUES ('{}', 0, 'ABC123', 1, 'QR1', 0, 0)",
                quote));
        runPlain(sql("INSERT INTO QUOTE3 (QTNNO, Subquote, remarks) VALUES ('{}', 0, '')", quote));
        for (qint64 line = 1; line <= lines; ++line)
            runPlain(
                sql("INSERT INTO QUOTE2 (QTNNO, Subquote, SEQ_NO, category, script, rrhour, rr_rate2, PartNo, "
                    "itemno, allow_tick) VALUES ('{}', 0, {}, '{}', 'Left front guard', 1, 38, '', '137', 7)",
                    quote, line, QString::fromLatin1(categories[line % 3])));
    }
    runPlain(u"COMMIT"_s);
}

QString element(const char* name, const QString& text)
{
    const QString tag = u"p754:"_s + QString::fromLatin1(name);
    return u'<' + tag + u'>' + text + u"</"_s + tag + u'>';
}

/// Returns the lines of a message. The amounts differ in each round, so that every line is written.
QString body(int64_t lines, const char* indicator, int round)
{
    QString labours;
    for (qint64 line = 1; line <= lines; ++line)
        labours += element("labour", element("quoteLineChangeIndicator", QString::fromLatin1(indicator)) +
                                         element("quoteLineNumber", QString::number(line)) +
                                         element("labourType", QString::fromLatin1(labourTypes[line % 3])) +
                                         element("labourGroup", u"Body"_s) +
                                         element("labourDescription", u"Left front guard"_s) +
                                         element("labourAmount", QString::number(10 + round)));
    QString totals;
    for (const char* total : {"labourTotal", "partTotal", "partMarkUpTotal", "gst", "paintTotal", "quoteTotal"})
        totals += element(total, u"0"_s);
    return element("quoteBody", element("quoteReference", u"1/0"_s) + element("quoteType", u"R"_s) +
                                    element("labours", labours) + totals);
}

QString message(const char* type, const char* root, const QString& elements)
{
    return u"<p754:%1 xmlns:p754=\"%2\"><messageType>%3</messageType>%4</p754:%1>"_s.arg(
        QString::fromLatin1(root), GetNamespaceURI(), QString::fromLatin1(type), elements);
}

QString authorised(int64_t lines, int round)
{
    QString elements;
    for (const auto& [name, text] : {std::pair("kestAuthorisedQuoteNumber", "KA1"),
                                     {"authorityNumber", "AU1"},
                                     {"quoteRequestNumber", "QR1"},
                                     {"kestOriginalQuoteNumber", "KQ1"},
                                     {"claimNumber", "7700001"},
                                     {"claimManager", "Robin Sayle"},
                                     {"corporateCustomer", ""},
                                     {"vehicleRegistration", "ABC123"},
                                     {"repairCompletionDate", "2008-04-11"},
                                     {"assessmentComment", "None"},
                                     {"authorisedAmount", "1000"}})
        elements += element(name, QString::fromLatin1(text));
    elements += element("authorisedQuoteClaimCustomer", element("companyName", u"Holloway Freight"_s));
    elements +=
        element("orlaContact", element("name", u"Morgan Whitby"_s) + element("phone", u"1"_s) + element("fax", u"2"_s));
    return message("AUQT", "getAuthorisedQuoteResponse", elements + body(lines, "C", round));
}

QString manual(int64_t lines, int round)
{
    QString elements;
    for (const auto& [name, text] : {std::pair("kestQuoteNumber", "KQ1"),
                                     {"quoteRequestNumber", "QR1"},
                                     {"claimNumber", "7700001"},
                                     {"vehicleRegistration", "ABC123"},
                                     {"vehicleDescription", "Corella"}})
        elements += element(name, QString::fromLatin1(text));
    return message("MANQ", "getQuoteResponse", elements + body(lines, "I", round));
}

constexpr const char* selectsOfQuote[] = {
    "SELECT * FROM QUOTE1 WHERE QTNNO='2' AND SUBQUOTE='0'", "SELECT * FROM QUOTE2 WHERE QTNNO='2' AND SUBQUOTE='0'",
    "SELECT * FROM QUOTE3 WHERE QTNNO='2' AND SUBQUOTE='0'", "SELECT * FROM CAR WHERE REGO='ABC123'",
    "SELECT * FROM INSURER WHERE INSURER_ID=1"};

void updateHeader(int round)
{
    runPlain(
        sql("UPDATE QUOTE1 SET KESTQuoteNo='KQ1', Claim='7700001', RR_RATE=1, RA_RATE=1, paint_rate=1, QSENT='R', "
            "TOTAL=0, PRTTOTAL=0, MISTOTAL=0, Job_stage={} WHERE QTNNO='2' AND Subquote=0",
            round));
}

void updateTotals(int round)
{
    runPlain(sql("UPDATE QUOTE1 SET TOTAL={}, PRTTOTAL={}, MISTOTAL={} WHERE QTNNO='2' AND Subquote=0", round, round,
                 round));
}

void statementsOfAuthorised(int64_t, int round)
{
    for (const char* select : selectsOfQuote)
        runPlain(QString::fromLatin1(select));
    const QList<qint64> lines =
        runPlain(QString::fromLatin1(selectsOfQuote[1]));  // because the comparison reads them too
    runPlain(QString::fromLatin1(selectsOfQuote[0]));
    updateTotals(-round);
    updateHeader(round);
    for (const qint64 line : lines)
        runPlain(
            sql("UPDATE QUOTE2 SET rrhour={}, rahour={}, unitcost={}, rr_rate2=1, opg_rate=0, Tag=1, tosend='A', "
                "script='Left front guard' WHERE itemid={}",
                10 + round, 10 + round, 10 + round, line));
    runPlain(sql("UPDATE QUOTE3 SET remarks='({} : Authorised Quote)' WHERE QTNNO='2' AND Subquote=0", round));
    updateTotals(round);
    runPlain(u"SELECT * FROM ExternalSettings WHERE TAG='JOBLINK'"_s);
}

void statementsOfManual(int64_t lines, int round)
{
    runPlain(u"SELECT * FROM CINFO"_s);
    runPlain(u"SELECT * FROM KESTColours"_s);
    for (const char* select : selectsOfQuote)
        runPlain(QString::fromLatin1(select));
    for (const qint64 line : runPlain(u"SELECT itemid FROM QUOTE2 WHERE QTNNO='2' AND SUBQUOTE='0'"_s))
        runPlain(sql("DELETE FROM QUOTE2 WHERE itemid={}", line));
    updateHeader(round);
    for (qint64 line = 1; line <= lines; ++line) {
        runPlain(
            sql("INSERT INTO QUOTE2 (QTNNO, Subquote, SEQ_NO, category, script, rrhour, rr_rate2, allow_tick, "
                "opg_rate, Tag, delitem, VENDOR, tosend, PartNo, blend) "
                "VALUES ('2', 0, {}, 'R&R', 'Left front guard', {}, 1, 7, 0, 1, 0, 0, 'A', '', 0)",
                line, 10 + round));
        const qint64 row = runPlain(u"SELECT last_insert_rowid()"_s).constFirst();
        runPlain(sql("SELECT rahour, pthour, qty, unitcost, DELETEDITEM, Report, Report_on FROM QUOTE2 WHERE itemid={}",
                     row));
        runPlain(sql("UPDATE QUOTE2 SET itemno='137' WHERE itemid={}", row));
    }
    updateTotals(round);
    runPlain(sql("UPDATE QUOTE3 SET remarks='({} : Manual Quote Loaded)' WHERE QTNNO='2' AND Subquote=0", round));
}

/// Runs loads and statements in turn and reports the ratio of their times.
void compare(benchmark::State& state, QString (*message)(int64_t, int), void (*statements)(int64_t, int))
{
    const BenchShop shop;
    addQuotes(state.range(0));
    InTurn times(state);
    int round = 0;
    for (auto _ : state) {
        ++round;
        times.floor([&] { statements(state.range(0), round); });
        QString text = message(state.range(0), round);
        files::write(gsUnreadPath + u"m.xml"_s, text);
        bool taken = false;
        times.operation([&] { taken = LoadXML(text, u"m.xml"_s); });
        if (!taken)
            state.SkipWithError("the message was not loaded");
    }
}

void loadAuthorisedQuote(benchmark::State& state)
{
    compare(state, authorised, statementsOfAuthorised);
}

void loadManualQuote(benchmark::State& state)
{
    compare(state, manual, statementsOfManual);
}

BENCHMARK(loadAuthorisedQuote)->Arg(10)->Arg(100)->Iterations(20)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(loadAuthorisedQuote)->Arg(1000)->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(loadManualQuote)->Arg(10)->Arg(100)->Iterations(20)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(loadManualQuote)->Arg(1000)->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace kest

// Does one operation of the shop once, in a shop of a chosen size, for `count`, which counts its instructions,
// statements and calls for files: operations NAME SIZE.
#include "base/History.h"
#include "base/Journal.h"
#include "base/modDBAccess.h"
#include "messagelist/TakeIn.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "outbound/SendQuote.h"
#include "platform/print/Pages.h"
#include "platform/print/Report.h"
#include "reports/BuildAuthReport.h"
#include "sublets/SubletDocuments.h"
#include "support/OdbcDrivers.h"
#include "support/Places.h"
#include "support/Shop.h"

#include <QApplication>
#include <QTemporaryDir>

#include <cstdlib>
#include <functional>
#include <map>
#include <optional>
#include <string>

/// What is counted. The name is not mangled, so that `count` can give it to valgrind.
extern "C" __attribute__((noinline)) void measured(const std::function<void()>& operation)
{
    operation();
}

namespace {

struct Bench : Shop {
    using Shop::arrive;
    using Shop::bring;
    using Shop::desktop;
    void TestBody() override {}
};

/// Adds rows to a table. In `values`, i is the number of the row.
void addRows(const char* table, const char* columns, const char* values, int rows)
{
    gConn->execute(
        u"WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < %1) INSERT INTO %2 (%3) SELECT %4 "
        "FROM n"_s.arg(rows)
            .arg(QLatin1StringView(table), QLatin1StringView(columns), QLatin1StringView(values)));
}

void addQuotes(int quotes)
{
    addRows("CAR", "REGO, CUST_ID, MODEL_ID", "'R' || i, 100 + i, 'C120'", quotes);
    addRows("CUSTOMER", "CUST_ID, NAME, FIRSTNAME", "100 + i, 'Name' || i, 'Kim'", quotes);
    addRows("QUOTE1", "QTNNO, Subquote, REGO, INSURER_ID, KESTQRNo, KESTQRVer, KESTQuoteNo",
            "'Q' || i, 0, 'R' || i, 1, 'QR' || i, '1', 'KQ' || i", quotes);
    addRows("QUOTE3", "QTNNO, Subquote, remarks", "'Q' || i, 0, ''", quotes);
}

void addLines(int lines)
{
    quote("500").request("QR1").quoteNumber("KQ1").remarks("(01/02/2026 : Active Quote Request)");
    addRows("QUOTE2", "QTNNO, Subquote, SEQ_NO, category, script, rrhour, rr_rate2, qty, PartNo, itemno, MARK",
            "'500', 0, i, CASE i % 3 WHEN 0 THEN 'R&R' WHEN 1 THEN 'RA' ELSE 'MIS' END, 'Front guard', 1, 38.5, 1, '', "
            "'137', ''",
            lines);
}

void addSettledOperations(int operations)
{
    addRows("KESTOperation", "OperationKind, State, StartedAt", "'load', 'done', '2999-01-01T00:00:00'", operations);
}

void expect(bool happened)
{
    if (!happened)
        qFatal("The operation did not do its work.");
}

void measureFill(qsizetype rows)
{
    measured([&] { expect(listed().size() == rows); });
}

/// Loads a message as the window does: what it changes is recorded.
void measureLoad(const QString& text)
{
    measured([&] {
        journal::Operation operation(journal::Kind::Load);
        expect(load(text));
        operation.end(journal::State::Done);
    });
}

QString authorisation(int lines)
{
    Message message = authorisedQuote("500").rego("ABC123");
    for (int line = 1; line <= lines; ++line)
        message.labour(line, "C");
    return message.text();
}

void measureSend(int lines, int otherQuotes = 1)
{
    addQuotes(otherQuotes);
    addLines(lines);
    db::Recordset panel = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    measured([&] { expect(SendQuote(panel) > 0); });
}

/// What is done, in a shop of that size.
const std::map<std::string, std::function<void(Bench&, int)>> operations{
    {"fill",
     [](Bench& shop, int messages) {
         for (int i = 0; i < messages; ++i)
             shop.arrive(u"%1.xml"_s.arg(i), quoteRequest(u"QR%1"_s.arg(i)));
         measureFill(messages);
     }},
    {"waiting",
     [](Bench& shop, int messages) {
         for (int i = 0; i < messages; ++i)
             shop.arrive(u"%1.xml"_s.arg(i), quoteRequest(u"QR%1"_s.arg(i)).images({"1", "2"}));
         measureFill(0);
     }},
    {"fill-from-tables",
     [](Bench& shop, int quotes) {
         constexpr int messages = 20;
         addQuotes(quotes);
         for (int i = 1; i <= messages; ++i)
             shop.arrive(u"%1.xml"_s.arg(i), cancellation(u"QR%1"_s.arg(i)));
         measureFill(messages);
     }},
    {"load-request",
     [](Bench&, int quotes) {
         addQuotes(quotes);
         measureLoad(quoteRequest("QRNEW").text());
     }},
    {"load-pictures",
     [](Bench& shop, int pictures) {
         for (int i = 0; i < pictures; ++i)
             files::write(gsImagesPath + u"%1_0001.jpg"_s.arg(i), {});
         for (const char* file : {"QRNEW_001.jpg", "QRNEW_002.jpg", "QRNEW_003.jpg"})
             shop.arrive(file, "picture");
         measureLoad(quoteRequest("QRNEW").images({"1", "2", "3"}).text());
         expect(files::exists(gsImagesPath + u"1001_0003.jpg"_s));
     }},
    {"load-documents",
     [](Bench&, int documents) {
         quote("500").quoteNumber("KQ1");
         for (int i = 0; i < documents; ++i)
             files::write(subletFolder() + u"%1.0_1.pdf"_s.arg(1000 + i), {});
         Message message = manualQuote("500").rego("ABC123");
         for (const int line : {11, 12, 13})
             message.sublet(line, "I", {{"subletAuthorityDocument", "SGVsbG8="}});
         measureLoad(message.text());
     }},
    {"load-manual",
     [](Bench&, int quotes) {
         addQuotes(quotes);
         car("ABC123");
         addRows("CAR", "REGO, CUST_ID, MODEL_ID", "'XBC' || i, 100 + i, 'C120'", quotes);
         measureLoad(manualQuote("Q5").rego("ABC123").labour(1, "C").text());
     }},
    {"load-unasked",
     [](Bench&, int quotes) {
         addRows("QUOTE1", "QTNNO, Subquote, KESTQRNo", "'Q' || i, 0, ''", quotes);  // the host's own
         car("ABC123");
         measureLoad(manualQuote("999").request("").rego("ABC123").labour(1, "C").text());
     }},
    {"notes",
     [](Bench&, int notes) {
         QString chain;
         for (int i = 0; i < notes; ++i)
             chain += u"(01/02/2026 : Note %1) "_s.arg(i);
         quote("500").request("QR1").remarks(chain);
         measureLoad(cancellation("QR1").text());
     }},
    {"load-authorised",
     [](Bench&, int lines) {
         addLines(lines);
         measureLoad(authorisation(lines));
     }},
    {"load-authorised-one",
     [](Bench&, int quotes) {
         addQuotes(quotes);
         addLines(10);
         measureLoad(authorisation(10));
     }},
    {"load-cancellation",
     [](Bench&, int quotes) {
         addQuotes(quotes);
         measureLoad(cancellation("QR5").text());
     }},
    {"load-result",
     [](Bench&, int quotes) {
         addQuotes(quotes);
         measureLoad(assessmentResult("KQ5").text());
     }},
    {"load-sublets",
     [](Bench&, int vendors) {
         addLines(10);
         addRows("VENDOR", "NAME", "'Vendor ' || i", vendors);
         Message message = authorisedQuote("500").rego("ABC123");
         for (int line = 11; line <= 30; ++line)
             message.sublet(line, "I", {{"subletRepairer", "Windscreens"}});
         measureLoad(message.text());
     }},
    {"delete-quote",
     [](Bench& shop, int lines) {
         addLines(lines);
         gConn->execute(u"UPDATE QUOTE2 SET Subquote=1"_s);
         quote("500", 1).quoteNumber("KQ2");
         shop.desktop.emplace(R"({"boxes": [{"text": "DELETED", "answer": "yes"}]})");
         measureLoad(quoteDeletion("KQ2").text());
     }},
    {"print",
     [](Bench&, int lines) {
         addLines(lines);
         QString text = authorisation(lines);
         QString number;
         QString subquote;
         std::optional<db::Recordset> table = BuildAuthReport(parsedMessage(text), number, subquote, false);
         expect(table && table->recordCount() == lines);
         report::Report report(checkoutFile(u"templates/730.html"_s));
         report.setTable(report::tableOf(*table));
         const QTemporaryDir folder;
         measured([&] { report::writePdf(report, folder.filePath(u"report.pdf"_s)); });
     }},
    {"send", [](Bench&, int lines) { measureSend(lines); }},
    {"send-one", [](Bench&, int quotes) { measureSend(10, quotes); }},
    {"send-pictures",
     [](Bench&, int waiting) {
         for (int i = 0; i < waiting; ++i)
             files::write(gsUnsentPath + u"I_%1_0001.jpg"_s.arg(i), {});
         for (int i = 1; i <= 3; ++i)
             files::write(gsImagesPath + u"500_000%1.jpg"_s.arg(i), {});
         measureSend(10);
         expect(files::exists(gsUnsentPath + u"I_500_0003.xml"_s));
     }},
    {"take-in",
     [](Bench& shop, int descriptions) {
         QList<QUrl> brought;
         for (int i = 0; i < descriptions; ++i)
             brought.append(shop.bring(u"%1_001.txt"_s.arg(i), {}));
         measured([&] { expect(takeInFiles(brought).descriptions == descriptions); });
     }},
    {"connect",
     [](Bench&, int settled) {
         addSettledOperations(settled);
         gConn->close();
         measured([] { expect(EnsureConnection()); });
     }},
    {"prune",
     [](Bench&, int settled) {
         addSettledOperations(settled);
         measured([] { journal::prune(); });
     }},
    {"move-loaded",
     [](Bench& shop, int readFiles) {
         quote("500").request("QR1");
         for (int i = 0; i < readFiles; ++i)
             files::write(gsReadPath + u"%1.0_1.xml"_s.arg(1000 + i), {});
         shop.arrive("in.xml", cancellation("QR1"));
         measured([] { MoveMessage(u"in.xml"_s, u"read"_s); });
         expect(files::exists(gsReadPath + u"500.0_1.xml"_s));
     }},
};

}  // namespace

int main(int argc, char** argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    const OdbcDrivers drivers(OdbcDrivers::Own);
    const QApplication application(argc, argv);
    if (argc != 3 || !operations.contains(argv[1]))
        return 2;
    Bench shop;
    operations.at(argv[1])(shop, std::atoi(argv[2]));
    return 0;
}

// What the insurer changed beside what the shop had quoted, cell by cell.
#include "messages/Envelope.h"
#include "reports/BuildAuthReport.h"
#include "reports/QuoteComparison.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

class Comparison : public Shop {
protected:
    static db::Recordset authorised(const Message& message, bool reprint = false)
    {
        QString text = message.text();
        QString number;
        QString subquote;
        auto table = BuildAuthReport(ParsedMessage(text), number, subquote, reprint);
        EXPECT_TRUE(table.has_value());
        return table ? std::move(*table) : db::Recordset();
    }
    static db::Recordset adjusted(const Message& message, bool reprint = false)
    {
        QString text = message.text();
        db::Recordset table = OpenComparison(ComparisonOf::AdjustedQuote);
        EXPECT_TRUE(FillAdjustedReport(table, ParsedMessage(text), reprint));
        return table;
    }
    static bool matches(const Message& message, const char* number = "", const char* subquote = "")
    {
        QString text = message.text();
        QString quoteNumber = QString::fromLatin1(number);
        QString quoteSubquote = QString::fromLatin1(subquote);
        return BuildAuthReport(ParsedMessage(text), quoteNumber, quoteSubquote, false).has_value();
    }
    /// The cells of the current row, one that was never set as "-".
    static std::string cells(const db::Recordset& table, const char* fields)
    {
        QStringList texts;
        for (const QString& field : QString::fromLatin1(fields).split(u' '))
            texts.append(table.isNull(field) ? u"-"_s : table.text(field));
        return texts.join(u'|').toStdString();
    }
    static std::string column(db::Recordset table, const char* field)
    {
        QStringList texts;
        if (table.recordCount() > 0)
            for (table.moveFirst(); !table.eof(); table.moveNext())
                texts.append(QString::fromStdString(cells(table, field)));
        return texts.join(u' ').toStdString();
    }
    static void expectCells(db::Recordset& table, int line, const char* expected, const char* which)
    {
        table.moveFirst();
        table.find(u"line_no='%1'"_s.arg(line));
        ASSERT_FALSE(table.eof()) << line;
        EXPECT_EQ(cells(table, "amount old_amount qty old_qty itemno category script gst"), expected)
            << which << ", line " << line;
    }
};

}  // namespace

TEST_F(Comparison, EachLineStandsBesideTheShops)
{
    QuoteRow q = quote("500").request("QR1");
    const auto labour = [&](int number, const char* category, const char* script) {
        return q.line(number, category, script).set("qty", nullptr).set("rr_rate2", 30.0).set("unitcost", nullptr);
    };
    labour(1, "R&R", "Guard").set("rrhour", 2.0).set("qty", 3.0).set("itemno", "137");
    labour(2, "RA", "Door").set("rahour", 1.5).set("rr_rate2", 40.0).set("qty", 1.0).set("itemno", " 138");
    labour(4, "MIS", "Levy").set("unitcost", 12.5);
    labour(5, "MIS", "Storage").set("rrhour", nullptr).set("rahour", 2.0);
    labour(6, "R&R", "Bonnet").set("rrhour", 2.0).set("rr_rate2", nullptr);
    const auto part = [&](int number) {
        return q.line(number, "PRT", "Shop part").set("qty", 2.0).set("unitcost", 150.0).set("rrhour", 187.5);
    };
    for (int number : {10, 11, 12, 13})
        part(number).set("itemno", "780");
    part(13).set("qty", nullptr);
    q.line(20, "PAINT", "Panel").set("pthour", 3.0).set("rr_rate2", 50.0).set("qty", nullptr);
    q.line(21, "PAINT", "Sill").set("pthour", 2.0).set("rr_rate2", nullptr).set("qty", 1.0).set("itemno", "303");
    q.line(22, "PAINT", "Pillar").set("pthour", nullptr).set("qty", 1.0);
    q.line(30, "MIS", "Alignment").set("PartNo", "WHAL").set("unitcost", 80.0).set("itemno", "990");
    q.line(31, "MIS", "Alignment").set("PartNo", "WHAL").set("unitcost", 80.0).set("itemno", "990");
    q.line(32, "MIS", "Valet").set("PartNo", "XXXX").set("unitcost", 55.0);

    const auto withLines = [](Message message) {
        const char* description = "A description that is longer than a line takes";
        message.labour(1, "C", {{"labourDescription", "Guard fitted"}, {"labourAmount", "45"}})
            .labour(2, "D")
            .labour(3, "I", {{"labourDescription", description}})
            .labour(4, "C", {{"labourType", "OTH"}, {"labourAmount", "10"}, {"labourDescription", " "}})
            .labour(5, "C", {{"labourType", ""}, {"labourDescription", "x"}})
            .labour(6, "C", {{"labourDescription", "x"}})
            .labour(7, "D")
            .part(10, "C",
                  {{"partDescription", "x"}, {"partQuantity", "1"}, {"partUnitPrice", "120"}, {"partAmount", "120"}})
            .part(11, "C",
                  {{"partDescription", "x"}, {"partQuantity", "2"}, {"partUnitPrice", "120"}, {"partAmount", "240"}})
            .part(12, "D")
            .part(13, "D")
            .part(14, "I", {{"partDescription", "x"}, {"partUnitPrice", ""}, {"partAmount", ""}})
            .paint(20, "C", {{"paintDescription", "x"}, {"paintAmount", "120"}})
            .paint(21, "D")
            .paint(22, "D")
            .sublet(30, "C", {{"subletDescription", "x"}})
            .sublet(31, "D")
            .sublet(32, "D")
            .sublet(33, "I", {{"subletDescription", "x"}, {"subletType", ""}});
        return message;
    };
    const struct {
        int line;
        const char* authorised;
        const char* adjusted;
    } cases[] = {
        // amount, old amount, quantity, old quantity, item, category, text, tax
        {1, "45|60|1|3|137|RR|Guard fitted|0", "45|60|0|3|137|RR|Guard fitted|0"},
        {2, "60|60|1|1|138|REPR|Door|0", "60|60|0|0| 138|REPR|Door|0"},
        {3, "100|-|1|-||RR|A description that is longer than a lin|0",
         "100|-|0|0|000|RR|A description that is longer than a lin|0"},
        {4, "10|12.5|1|-||OTH|Levy|0", "10|12.5|0|0|000|OTH|Levy|0"},
        {5, "100|60|1|-||OTH|x|0", "100|60|0|0|000|OTH|x|0"},
        {6, "100|-|1|-||RR|x|0", "100|-|0|0|000|RR|x|0"},
        {7, "|-|1|-||||0", "0|-|0|0|000|||0"},
        {10, "120|150|0|2|780||x|0", "120|150|1|2|780||x|12"},
        {11, "120|150|0|2|780||x|0", "120|150|0|0|780||x|24"},
        {12, "187.5|150|2|2|780||Shop part|0", "150|150|2|2|780||Shop part|0"},
        {13, "187.5|150|0|0|780||Shop part|0", "187.5|150|0|0|780||Shop part|0"},
        {14, "|-|1|-|||x|0", "-|-|1|-|000||x|0"},
        {20, "120|150|1|0||PAIN|x|0", "120|150|0|0||PAIN|x|0"},
        {21, "2|2|1|1|303|PAIN|Sill|0", "2|2|1|1|303|PAIN|Sill|0"},
        {22, "0|0|1|1||PAIN|Pillar|0", "0|0|1|1||PAIN|Pillar|0"},
        {30, "0|0|1|0|990|WHAL|x|0", "0|0|1|0|990|WHAL|x|0"},
        {31, "80|0|1|0|990|WHAL|Alignment|0", "80|0|1|0|990|WHAL|Alignment|0"},
        {32, "55|0|1|0||MIS|Valet|0", "55|0|1|0||MIS|Valet|0"},
        {33, "0|0|1|0|||x|0", "0|0|1|0|33||x|0"},
    };
    db::Recordset authorisedTable = authorised(withLines(authorisedQuote("500")));
    db::Recordset adjustedTable = adjusted(withLines(adjustedQuote("500")));
    for (const auto& c : cases) {
        expectCells(authorisedTable, c.line, c.authorised, "authorised");
        expectCells(adjustedTable, c.line, c.adjusted, "adjusted");
    }
}

TEST_F(Comparison, TheHeaderIsOnEveryRow)
{
    quote("500").request("QR1").set("TOTAL", 242.0);
    Message told = authorisedQuote("500/0");
    told.set("kestAuthorisedQuoteNumber", "A number that is too long")
        .set("assessmentComment", "Names & \"quotes\" é")
        .set("quoteBody/quoteTotal", "1,141.25")
        .set("quoteBody/gst", "103.75");
    told.labour(1, "I").labour(2, "I");
    db::Recordset table = authorised(told);
    for (table.moveFirst(); !table.eof(); table.moveNext()) {
        EXPECT_EQ(cells(table,
                        "KESTQuoteNo authority_no complete_date ass_name ass_ph ass_fax auth_amt quote_ref "
                        "quote_type quote_total sub_repairer action total_md"),
                  "A number tha|AU55001|2008-04-11|Morgan Lee Whitby|03 5550 2020|03 5550 2021|1000|500/0|AUTR|"
                  "1037.5||I|0");
        EXPECT_EQ(cells(table, "comment"), "Names & \"quotes\" é");
    }

    quote("500").set("TOTAL", 242.0);
    Message suggested = adjustedQuote("500");
    suggested.set("quoteBody/quoteTotal", "868.730").labour(1, "C");
    table = adjusted(suggested);
    EXPECT_EQ(cells(table,
                    "KESTQuoteNo comment authority_no complete_date ass_name ass_ph ass_fax excess contri "
                    "auth_amt quote_ref quote_type quote_total sub_repairer action total_md"),
              "KJ1|Repair the bumper|0|||||0|0|0|500|ADJR|868.730||C|242");
    EXPECT_FALSE(table.hasColumn(u"vendor"_s));
    EXPECT_EQ(table.columns().size(), 27);
}

TEST_F(Comparison, ExcessAndContributionStandOnlyWhereTheyDiffer)
{
    const struct {
        const char* excess;
        const char* contribution;
        const char* expected;
    } cases[] = {
        {"400.004", "110", "0|0"},
        {"400.01", "110.02", "400.01|110.02"},
        {"0", "0", "0|0"},
        {"$400", "", "error"},
        {"", "", "|"},
        {nullptr, nullptr, "|"},
        {"400", "121", "0|121"},
    };
    quote("500").request("QR1").set("excess", 400.0).set("contri", 100.0).line(1);
    quote("500", 1).request("QR1").set("excess", 1.0).set("contri", 1.0);  // those of the main quote count
    for (const auto& c : cases) {
        for (const char* reference : {"500", "500/1"}) {
            Message message = authorisedQuote(reference);
            message.without("excess").without("customerContribution");
            if (c.excess)
                message.set("excess", c.excess).set("customerContribution", c.contribution);
            if (std::string(c.expected) == "error") {
                EXPECT_FALSE(matches(message));
                EXPECT_EQ(shown(), "[none] error");
                continue;
            }
            EXPECT_EQ(cells(authorised(message), "excess contri"), c.expected) << reference;
        }
    }
    quote("500").set("excess", nullptr).set("contri", nullptr);
    Message message = authorisedQuote("500");
    EXPECT_EQ(cells(authorised(message.set("customerContribution", "5")), "excess contri"), "0|5");
}

TEST_F(Comparison, UnchangedLinesHaveNoRowAndDeletedOnesNoneOnAReprint)
{
    quote("500").request("QR1").line(1).set("qty", 1.0);
    quote("500").line(2, "PRT").set("qty", 1.0);
    const auto lines = [](Message message) {
        return message.labour(1, "N").labour(3, "I").part(2, "D").part(4, "").paint(5, "I").paint(6, "");
    };
    // a line without an indicator has that of the line before it in its section, as when it is loaded
    EXPECT_EQ(column(authorised(lines(authorisedQuote("500"))), "line_no"), "3 2 4 5 6");
    EXPECT_EQ(column(authorised(lines(authorisedQuote("500"))), "action"), "I D D I I");
    EXPECT_EQ(column(authorised(lines(authorisedQuote("500")), true), "line_no"), "3 5 6");
    EXPECT_EQ(column(adjusted(lines(adjustedQuote("500"))), "line_no"), "3 2 4 5 6");
    EXPECT_EQ(column(adjusted(lines(adjustedQuote("500")), true), "line_no"), "3 5 6");
}

TEST_F(Comparison, AnAuthorisedQuoteWithoutChangesStillHasARow)
{
    quote("500").request("QR1").line(1, "R&R").set("rrhour", 2.0).set("rr_rate2", 30.0).set("qty", 1.0);
    quote("500").line(2, "PRT").set("rrhour", 10.0).set("qty", 3.0);
    quote("500").line(3, "MIS").set("unitcost", 5.5).set("qty", 1.0);
    const db::Recordset table = authorised(authorisedQuote("500").labour(1, "N"));
    EXPECT_EQ(table.recordCount(), 1);
    EXPECT_EQ(cells(table,
                    "action qty gst total_md line_no itemno lab_grp paint_grp category script amount vendor "
                    "old_amount old_qty quote_type"),
              "N|1|0|95.5|||||||||||AUTR");
    EXPECT_EQ(quote("500").number("TOTAL"), 60);  // the totals are worked out, whoever asks
    EXPECT_EQ(adjusted(adjustedQuote("500").labour(1, "N")).recordCount(), 0);
}

TEST_F(Comparison, ASubletRepairerIsAVendorAndBecomesOneByAMerePrint)
{
    quote("500").request("QR1");
    const int known = vendor("Straightline Alignment Pty Ltd").id();
    Message message = authorisedQuote("500");
    message.sublet(1, "I")
        .sublet(2, "N", {{"subletRepairer", "Nobody"}})
        .sublet(3, "I", {{"subletRepairer", "O'Hara & Sons"}});
    EXPECT_EQ(column(authorised(message, true), "vendor"), std::to_string(known) + " " + std::to_string(known + 1));
    EXPECT_EQ(column(authorised(message, true), "vendor"), std::to_string(known) + " " + std::to_string(known + 1));
    EXPECT_EQ(rowCount("VENDOR"), 2);
    const VendorRow made = vendor("O'Hara & Sons");
    EXPECT_EQ(made.number("Account"), 293);
    EXPECT_EQ(made.text("STREET") + "|" + made.text("PHONE"), "8 Foundry Lane|03 5550 1010");
    EXPECT_FALSE(made.isNull("vendor_abn"));
    adjusted(adjustedQuote("500").sublet(4, "I", {{"subletRepairer", "Another"}}));
    EXPECT_EQ(rowCount("VENDOR"), 2);
}

TEST_F(Comparison, WithoutItsQuoteThereIsABoxAndNoTable)
{
    quote("500").request("QR9");
    quote("500", 2).request("QR1");
    EXPECT_FALSE(matches(authorisedQuote("500")));
    EXPECT_EQ(shown(), "[critical] Matching quote was not found in database, Please contact MarlinDesk Support.");
    EXPECT_TRUE(matches(authorisedQuote("500"), "500", "2"));  // a number that the caller knows goes first
    quote("500", 2).request("QR2");
    QString text = adjustedQuote("500/2").text();
    db::Recordset table = OpenComparison(ComparisonOf::AdjustedQuote);
    EXPECT_FALSE(FillAdjustedReport(table, ParsedMessage(text), false));
    EXPECT_EQ(shown(), "[critical] Quote not found in database. Please contact MarlinDesk Support.");
    quote("500", 2).request("QR1");
    Message broken = authorisedQuote("500/2");
    EXPECT_FALSE(matches(broken.without("authorityNumber")));
    EXPECT_EQ(shown(), "[none] error");
}

}  // namespace kest::test

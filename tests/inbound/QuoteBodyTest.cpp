// What the lines of a message do to the lines of a quote: by section, by change indicator, and with bad values.
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "outbound/SubletDocuments.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/Shop.h"

#include <QRegularExpression>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

class QuoteBody : public Shop {
protected:
    QuoteBody() { gbSubletDocumentArrived = false; }

    /// Applies the lines of a message to the quote 500, or another one; shown boxes are taken away.
    bool apply(const Message& message, const Text& number = "500")
    {
        QString text = message.text();
        const xml::Document document = ParsedMessage(text);
        quote(number);
        const db::Recordset header = Opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='%1' AND Subquote=0"_s.arg(number));
        db::Recordset lines = Opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='%1' AND Subquote=0"_s.arg(number));
        return LoadQuoteBody(header, lines, document);
    }

    static QStringList documents() { return filesIn(SubletFolder()); }
};

Message body()
{
    return authorisedQuote("500");
}

/// "category=R&R rrhour=100", Null as "-".
std::string told(const Row& line, std::initializer_list<const char*> columns)
{
    std::string text;
    for (const char* column : columns)
        text += (text.empty() ? "" : " ") + std::string(column) + '=' + (line.isNull(column) ? "-" : line.text(column));
    return text;
}

/// The numbers of all lines, in the order in which they were stored.
std::string numbers(const Text& number = "500")
{
    db::Recordset rows = Opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='%1' ORDER BY itemid"_s.arg(number));
    QStringList found;
    for (; !rows.eof(); rows.moveNext())
        found += rows.text(u"SEQ_NO"_s);
    return found.join(u' ').toStdString();
}

const QString pdf = u"JVBERi0x"_s;  // "%PDF-1"

}  // namespace

TEST_F(QuoteBody, ANewLineIsFilledAsItsSectionSays)
{
    EXPECT_TRUE(apply(body()
                          .labour(1, "I", {{"labourType", "RR"}, {"labourAmount", "1,045.60"}})
                          .labour(2, "I", {{"labourType", "REPR"}, {"labourAmount", " 84 "}})
                          .labour(3, "I", {{"labourType", "OTH"}, {"labourAmount", "12.5"}})
                          .labour(4, "I", {{"labourType", "GLAS"}, {"labourAmount", "not read"}})
                          .part(5, "I", {{"partDescription", "L/H guard"}, {"partQuantity", "2"}})
                          .paint(6, "I", {{"paintDescription", std::string(40, 'd')}})
                          .sublet(7, "I")));

    const auto columns = {"category", "script",  "rrhour", "rahour",    "rr_rate2",   "opg_rate",
                          "unitcost", "VENDOR",  "blend",  "Tag",       "directbill", "tosend",
                          "PartNo",   "delitem", "itemno", "allow_tick"};
    const char* const labour[] = {
        "category=R&R script=Front bumper bar rrhour=1045.6 rahour=0 rr_rate2=1 opg_rate=0 unitcost=0 VENDOR=0 blend=0 "
        "Tag=1 directbill=- tosend=A PartNo= delitem=False itemno=137 allow_tick=7",
        "category=RA script=Front bumper bar rrhour=0 rahour=84 rr_rate2=1 opg_rate=0 unitcost=0 VENDOR=0 blend=0 "
        "Tag=1 directbill=- tosend=A PartNo= delitem=False itemno=138 allow_tick=7",
        "category=MIS script=Front bumper bar rrhour=0 rahour=0 rr_rate2=0 opg_rate=0 unitcost=12.5 VENDOR=0 blend=0 "
        "Tag=1 directbill=R tosend=A PartNo= delitem=False itemno=990 allow_tick=7",
        "category=- script=- rrhour=0 rahour=0 rr_rate2=0 opg_rate=0 unitcost=0 VENDOR=0 blend=0 "
        "Tag=1 directbill=- tosend=A PartNo= delitem=False itemno=999 allow_tick=7",
    };
    for (int number = 1; number <= 4; ++number)
        EXPECT_EQ(told(quote("500").line(number), columns), labour[number - 1]);
    EXPECT_EQ(told(quote("500").line(5), {"category", "script", "PartNo", "MARK", "qty", "unitcost", "rrhour", "SIDE",
                                          "VENDOR", "blend", "Tag", "delitem", "tosend", "itemno", "Report"}),
              "category=PRT script=L/H guard PartNo=52119-7K220 MARK=  qty=2 unitcost=200 rrhour=250 SIDE=L VENDOR=0 "
              "blend=0 Tag=1 delitem=False tosend=A itemno=780 Report=False");
    EXPECT_EQ(told(quote("500").line(6), {"category", "script", "pthour", "blend", "Tag", "delitem", "tosend",
                                          "rr_rate2", "allow_tick", "opg_rate", "itemno"}),
              "category=PAINT script=" + std::string(39, 'd') +
                  " pthour=150 blend=0 Tag=1 delitem=False tosend=A rr_rate2=1 allow_tick=7 opg_rate=1 itemno=139");
    EXPECT_EQ(told(quote("500").line(7), {"category", "script", "blend", "Report_on", "delitem", "tosend", "unitcost",
                                          "Tag", "itemno", "directbill"}),
              "category=MIS script=Four wheel alignment blend=0 Report_on=0 delitem=False tosend=A unitcost=0 Tag=1 "
              "itemno=991 directbill=R");
    EXPECT_EQ(numbers(), "1 2 3 4 5 6 7");
}

TEST_F(QuoteBody, TheIndicatorSaysWhatHappensToTheLine)
{
    const struct {
        const char* indicator;
        int line;
        const char* numbers;
        const char* firstScript;
    } cases[] = {
        {"", 1, "1 2 1", "old"}, {"I", 1, "1 2 1", "old"}, {"I", 3, "1 2 3", "old"},
        {"C", 1, "1 2", "new"},  {"C", 3, "1 2", "old"},   {"N", 1, "1 2", "old"},
        {"N", 3, "1 2", "old"},  {"D", 2, "1", "old"},     {"D", 3, "1 2", "old"},
    };
    const auto messages = [](int line, const char* indicator) {
        return std::vector<Message>{body().labour(line, indicator, {{"labourDescription", "new"}}),
                                    body().part(line, indicator, {{"partDescription", "new"}}),
                                    body().paint(line, indicator, {{"paintDescription", "new"}}),
                                    body().sublet(line, indicator, {{"subletDescription", "new"}})};
    };
    for (const auto& c : cases) {
        for (const Message& message : messages(c.line, c.indicator)) {
            gConn->execute(u"DELETE FROM QUOTE2"_s);
            quote("500").line(1, "R&R", "old");
            quote("500").line(2, "PRT");
            EXPECT_TRUE(apply(message));
            EXPECT_EQ(numbers(), c.numbers) << c.indicator << c.line;
            EXPECT_EQ(quote("500").line(1).text("script"), c.firstScript) << c.indicator << c.line;
        }
    }
    EXPECT_EQ(shown(), "");
}

TEST_F(QuoteBody, ALineWithoutIndicatorDoesAsTheOneBeforeItInItsSection)
{
    for (int line = 1; line <= 4; ++line)
        quote("500").line(line);
    EXPECT_TRUE(apply(body()
                          .labour(1, "C", {{"labourDescription", "changed"}})
                          .labour(2, "", {{"labourDescription", "changed"}})
                          .labour(3, "N", {{"labourDescription", "changed"}})
                          .labour(4, "", {{"labourDescription", "changed"}})
                          .part(1, "")));
    EXPECT_EQ(quote("500").line(2).text("script"), "changed");
    EXPECT_EQ(quote("500").line(4).text("script"), "Front bumper bar");
    EXPECT_EQ(numbers(), "1 2 3 4 1");  // the first part has nothing before it, so it is added
}

TEST_F(QuoteBody, AnUnknownIndicatorFailsTheBodyBeforeAnyLineIsTouched)
{
    quote("500").line(1);
    for (const char* unknown : {"X", "c", "CI"}) {
        EXPECT_FALSE(apply(body().labour(1, "D").labour(2, "I").sublet(9, unknown)));
        EXPECT_EQ(numbers(), "1");
        EXPECT_NE(shown().find("not known"), std::string::npos);
    }
}

TEST_F(QuoteBody, AChangeKeepsWhatTheShopSet)
{
    quote("500").line(1, "OPG").set("blend", 2).set("allow_tick", 3).set("itemno", "153");
    quote("500").line(2, "PRT").set("SIDE", "R").set("qty", 3).set("MARK", "C");
    quote("500").line(3, "MIS").set("VENDOR", 17).set("unitcost", 44).set("Report_on", 1);
    EXPECT_TRUE(
        apply(body()
                  .paint(1, "C", {{"paintAmount", "50"}})
                  .part(2, "C", {{"partDescription", "L/H lamp"}, {"partQuantity", "0.00"}, {"partType", "AFTM"}})
                  .sublet(3, "C", {{"subletRepairer", "Nobody knows"}, {"subletDescription", "Glass"}})));
    EXPECT_EQ(told(quote("500").line(1), {"category", "pthour", "opg_rate", "blend", "allow_tick", "itemno"}),
              "category=OPG pthour=50 opg_rate=1 blend=2 allow_tick=3 itemno=153");
    EXPECT_EQ(told(quote("500").line(2), {"script", "SIDE", "qty", "Report", "MARK"}),
              "script=L/H lamp SIDE=R qty=3 Report=True MARK=C");
    EXPECT_EQ(told(quote("500").line(3), {"script", "VENDOR", "unitcost", "Report_on"}),
              "script=Glass VENDOR=17 unitcost=44 Report_on=1");
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody knows'"), 0);
}

TEST_F(QuoteBody, SideAndKindOfAPart)
{
    const struct {
        const char *description, *type, *side, *mark;
    } cases[] = {
        {"l/h mirror", "RECY", "L", "U"},  {"R/H MIRROR", "EXCH", "R", "X"}, {"Mirror L/H", "NEW", "O", " "},
        {" L/H mirror", "recy", "O", "-"}, {"LH mirror", "", "O", "-"},
    };
    int number = 0;
    for (const auto& c : cases) {
        EXPECT_TRUE(apply(body().part(++number, "I", {{"partDescription", c.description}, {"partType", c.type}})));
        EXPECT_EQ(told(quote("500").line(number), {"SIDE", "MARK"}), std::string("SIDE=") + c.side + " MARK=" + c.mark);
    }
}

TEST_F(QuoteBody, ThePaintOfABlendedPanelLosesItsMarker)
{
    const std::pair<const char*, std::string> cases[] = {
        {"Door BLEND", "Door"},
        {"Door blend ", "Door "},
        {"BLEND", ""},
        {"Blend door", "Blend door"},
        {"A description of forty characters, blend", "A description of forty characters,"},
    };
    int number = 0;
    for (const auto& [description, script] : cases) {
        EXPECT_TRUE(apply(body().paint(++number, "I", {{"paintDescription", description}})));
        EXPECT_EQ(quote("500").line(number).text("script"), script);
    }
}

TEST_F(QuoteBody, TheRepairerOfANewSubletLineIsFoundOrAdded)
{
    vendor("O'Hara & Sons Glass (Wattlebridge)");
    Message message =
        body()
            .sublet(1, "I", {{"subletRepairer", "o'hara & sons"}})
            .sublet(2, "I", {{"subletRepairer", std::string(50, 'n')}})
            .sublet(3, "", {{"subletRepairer", "kept"}, {"subletRepairerAddress", std::string(120, 's')}});
    EXPECT_TRUE(apply(message));
    EXPECT_EQ(quote("500").line(1).number("VENDOR"), vendor("O'Hara & Sons Glass (Wattlebridge)").id());
    const Row added("VENDOR", "NAME='" + std::string(49, 'n') + "'");
    EXPECT_EQ(quote("500").line(2).text("VENDOR"), added.text("VENDOR_ID"));
    EXPECT_EQ(told(added, {"STREET", "PHONE", "contact", "SUBURB", "Fax", "accno", "email", "vendor_abn", "Account"}),
              "STREET=8 Foundry Lane PHONE=03 5550 1010 contact= SUBURB= Fax= accno= email= vendor_abn= Account=293");
    // the line before it said "I", and an address is cut to what the column holds
    EXPECT_EQ(Row("VENDOR", "NAME='kept'").text("STREET"), std::string(100, 's'));

    EXPECT_TRUE(apply(body().sublet(1, "", {{"subletRepairer", "Nobody"}}), "501"));
    EXPECT_EQ(told(quote("501").line(1), {"category", "tosend", "directbill"}), "category=MIS tosend=- directbill=-");
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody'"), 0);
}

TEST_F(QuoteBody, ASubletElementThatIsMissingKeepsTheOneOfTheLineBefore)
{
    QString text = body().sublet(1, "I", {{"subletDescription", "Glass"}}).sublet(2, "I").text();
    const qsizetype second = text.lastIndexOf(u"<p754:subletDescription>"_s);
    text.remove(second, text.indexOf(u"<p754:subletRepairerAddress>"_s, second) - second);
    const xml::Document message = ParsedMessage(text);
    quote("500");
    const db::Recordset header = Opened(u"SELECT * FROM QUOTE1"_s);
    db::Recordset lines = Opened(u"SELECT * FROM QUOTE2"_s);
    EXPECT_TRUE(LoadQuoteBody(header, lines, message));
    EXPECT_EQ(quote("500").line(2).text("script"), "Glass");
    EXPECT_EQ(quote("500").line(2).text("VENDOR"), quote("500").line(1).text("VENDOR"));
}

TEST_F(QuoteBody, ADocumentIsStoredUnderItsLinesNumber)
{
    const auto document = [](int line, const char* indicator) {
        return body().sublet(line, indicator, {{"subletAuthorityDocument", pdf.first(4) + u" \n"_s + pdf.sliced(4)}});
    };
    EXPECT_TRUE(apply(document(4, "I")));
    EXPECT_TRUE(gbSubletDocumentArrived);
    EXPECT_EQ(files::readBytes(SubletFolder() + u"500.0_4.pdf"_s), "%PDF-1");

    files::write(SubletFolder() + u"500.0_12.PDF"_s, u"of line 12"_s);
    files::write(SubletFolder() + u"500.1_30.pdf"_s, u"of a supplementary quote"_s);
    EXPECT_TRUE(apply(document(4, "N")));  // a second document of one line
    EXPECT_TRUE(apply(document(5, "D")));
    EXPECT_EQ(documents().join(u' ').toStdString(), "500.0_12.PDF 500.0_13.pdf 500.0_4.pdf 500.0_5.pdf 500.1_30.pdf");
    EXPECT_EQ(numbers(), "4");
}

TEST_F(QuoteBody, ALineWithoutNumberTakesOneAboveLinesAndDocuments)
{
    const auto document = [](const char* indicator) {
        return body().sublet(0, indicator, {{"subletAuthorityDocument", pdf}});
    };
    quote("500").line(2);
    EXPECT_TRUE(apply(document("I")));
    EXPECT_EQ(numbers(), "2 3");

    files::write(SubletFolder() + u"77.0_17.pdf"_s, u"any quote's; its last digit counts"_s);
    files::write(SubletFolder() + u".9.pdf"_s, u"hidden"_s);
    files::write(SubletFolder() + u"9.txt"_s, u"no document"_s);
    EXPECT_TRUE(apply(document("I")));
    EXPECT_EQ(numbers(), "2 3 8");

    // a quote without lines goes on from the line before
    EXPECT_TRUE(apply(body().sublet(40, "N").sublet(0, "N", {{"subletAuthorityDocument", pdf}}), "501"));
    EXPECT_TRUE(documents().contains(u"501.0_41.pdf"_s));
}

TEST_F(QuoteBody, ADocumentThatCannotBeStoredFailsTheBody)
{
    for (const QString& broken : {u"JVBERi0"_s, u"JVBE*i0x"_s, u"%PDF-1"_s}) {
        EXPECT_FALSE(apply(body().sublet(1, "I", {{"subletAuthorityDocument", broken}})));
        EXPECT_FALSE(shown().empty());
    }
    car("ABC123");
    quote("5/../0").line(1);
    EXPECT_FALSE(apply(body().sublet(1, "C", {{"subletAuthorityDocument", pdf}}), "5/../0"));
    EXPECT_FALSE(gbSubletDocumentArrived);
    EXPECT_TRUE(documents().isEmpty());
}

TEST_F(QuoteBody, ADocumentMayBeThirtyMegabytesLong)
{
    EXPECT_TRUE(apply(body().sublet(1, "I", {{"subletAuthorityDocument", QString(30 * 1024 * 1024, u'A')}})));
    EXPECT_EQ(files::size(SubletFolder() + u"500.0_1.pdf"_s), 30 * 1024 * 1024 / 4 * 3);
}

TEST_F(QuoteBody, LinesWithoutNumberGoOnFromTheLastOne)
{
    quote("n1").line(7);
    EXPECT_TRUE(apply(body().labour(0, "I").part(-3, "I").paint(90, "I").sublet(0, "I"), "n1"));
    EXPECT_EQ(numbers("n1"), "7 8 9 90 10");

    EXPECT_FALSE(apply(body().labour(0, "I"), "n2"));  // a quote without lines has no highest number
    EXPECT_EQ(numbers("n2"), "");
    EXPECT_FALSE(shown().empty());
    quote("n2").line(4);
    EXPECT_TRUE(apply(body().labour(0, "I"), "n2"));
    EXPECT_TRUE(apply(body().labour(0, "I"), "n1"));  // another quote came between
    EXPECT_EQ(numbers("n2"), "4 5");
    EXPECT_EQ(numbers("n1"), "7 8 9 90 10 91");
}

TEST_F(QuoteBody, ItemNumbersComeFromThePoolOfTheCategory)
{
    const struct {
        const char* category;
        int count;
        const char *first, *last;
    } pools[] = {
        {"R&R", 45, "137", "459"}, {"RA", 45, "137", "459"}, {"PAINT", 45, "137", "459"}, {"OPG ", 9, "153", "464"},
        {"PRT", 21, "780", "800"}, {"MIS", 7, "990", "998"}, {"NONE", 0, "", ""},
    };
    for (const auto& pool : pools) {
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        for (int line = 1; line <= pool.count + 1; ++line)
            quote("500").line(line, pool.category);
        db::Recordset lines = Opened(u"SELECT * FROM QUOTE2"_s);
        QStringList given;
        for (; !lines.eof(); lines.moveNext()) {
            const QString number = lines.text(u"SEQ_NO"_s);
            given += NextItemNo(lines);
            EXPECT_EQ(lines.text(u"SEQ_NO"_s), number);  // still on its line
            lines.set(u"itemno"_s, given.last());
        }
        EXPECT_EQ(given.takeLast(), u"999"_s) << pool.category;
        EXPECT_EQ(given.removeDuplicates(), 0) << pool.category;
        EXPECT_EQ(given.value(0).toStdString(), pool.first);
        EXPECT_EQ(given.isEmpty() ? "" : given.last().toStdString(), pool.last);
    }
}

TEST_F(QuoteBody, AValueThatDoesNotConvertEndsTheBodyAtItsLine)
{
    const auto first = [] { return body().labour(1, "I"); };
    Message wrong[] = {
        first().labour(2, "I", {{"labourAmount", "$10"}}),
        first().labour(2, "I", {{"labourAmount", ""}}),
        first().labour(2, "I", {{"labourAmount", "1e400"}}),
        first().labour(2, "I", {{"quoteLineNumber", "3000000000"}}),
        first().labour(2, "I", {{"quoteLineNumber", "two"}}),
        first().part(2, "I", {{"partQuantity", "2x"}}),
        first().part(2, "I", {{"partUnitPrice", "1,00.5"}}),
        first().part(2, "I", {{"partMarkUpPercentage", "10%"}}),
        first().paint(2, "I", {{"paintAmount", "ten"}}),
    };
    for (Message& message : wrong) {
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        EXPECT_FALSE(apply(message.sublet(3, "I")));
        EXPECT_FALSE(shown().empty());
        EXPECT_EQ(numbers(), "1");
    }
    EXPECT_FALSE(apply(body().labour(4, "D").labour(5, "I").without("quoteBody/gst")));
    EXPECT_EQ(numbers(), "1");
}

TEST_F(QuoteBody, ALineThatStaysMustBeComplete)
{
    quote("500").line(1);
    for (const char* element : {"labourType", "labourDescription", "labourAmount", "quoteLineNumber"}) {
        QString text = body().labour(1, "N").text();
        text.remove(QRegularExpression(u"<p754:%1>.*</p754:%1>"_s.arg(QString::fromLatin1(element))));
        const xml::Document message = ParsedMessage(text);
        const db::Recordset header = Opened(u"SELECT * FROM QUOTE1"_s);
        db::Recordset lines = Opened(u"SELECT * FROM QUOTE2"_s);
        EXPECT_FALSE(LoadQuoteBody(header, lines, message)) << element;
    }
}

TEST_F(QuoteBody, WhatIsOddButANumberIsTaken)
{
    EXPECT_TRUE(apply(body()
                          .part(70000, "I", {{"partQuantity", "-2"}, {"partUnitPrice", "-1e3"}})
                          .part(2147483647, "I", {{"partQuantity", "1e12"}})
                          .labour(5, "N", {{"labourAmount", "not read"}})
                          .labour(6, "I")
                          .labour(6, "I")
                          .labour(6, "C", {{"labourDescription", "the first of them"}})));
    EXPECT_EQ(numbers(), "6 6 70000 2147483647");
    EXPECT_EQ(told(quote("500").line(70000), {"qty", "unitcost", "rrhour"}), "qty=-2 unitcost=-1000 rrhour=-1250");
    EXPECT_EQ(quote("500").line(6).text("script"), "the first of them");
}

TEST_F(QuoteBody, TenThousandLines)
{
    Message message = body();
    for (int line = 1; line <= 10'000; ++line)
        message.labour(line, "I");
    gConn->execute(u"BEGIN"_s);  // 20,000 commits that nobody needs on the disk
    EXPECT_TRUE(apply(message));
    EXPECT_EQ(quote("500").lines(), 10'000);
    EXPECT_EQ(quote("500").line(10'000).text("itemno"), "999");
}

}  // namespace kest::test

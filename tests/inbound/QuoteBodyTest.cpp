// Tests what the lines of a message change in a quote, by section, by change indicator, and with bad values.
#include "inbound/LoadQuoteBody.h"
#include "inbound/NextNumbers.h"
#include "messages/Envelope.h"
#include "sublets/SubletDocuments.h"
#include "support/Shop.h"

struct QuoteBody : Shop {
    QuoteBody() { gbSubletDocumentArrived = false; }

    /// Applies the lines of a message to the quote 500 or another one. Forgets the boxes.
    bool apply(const Message& message, const Text& number = "500")
    {
        QString text = message.text();
        const xml::Document document = parsedMessage(text);
        quote(number);
        const db::Recordset header = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='%1' AND Subquote=0"_s.arg(number));
        db::Recordset lines = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='%1' AND Subquote=0"_s.arg(number));
        return LoadQuoteBody(header, lines, document);
    }

    static Row line(int number) { return quote("500").line(number); }
    static QStringList documents() { return filesIn(subletFolder()); }
};

static Message body()
{
    return authorisedQuote("500");
}

/// Returns the numbers of all lines in the order in which they were stored.
static std::string numbers(const Text& number = "500")
{
    db::Recordset rows = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='%1' ORDER BY itemid"_s.arg(number));
    QStringList found;
    for (; !rows.eof(); rows.moveNext())
        found += rows.text(u"SEQ_NO"_s);
    return found.join(u' ').toStdString();
}

const QString pdf = u"JVBERi0x"_s;  // "%PDF-1"

static Message withDocument(int number, const Text& change, const Text& document = pdf)
{
    return body().sublet(number, change, {{"subletAuthorityDocument", document}});
}

TEST_F(QuoteBody, ANewLineIsFilledAsItsSectionSays)
{
    const auto cases = casesIn<3>("inbound/new-lines.txt");
    Message message = body();
    int number = 0;
    for (const auto& [kind, elements, columns] : cases)
        message.line(kind, ++number, "I", fieldsIn(elements));
    EXPECT_TRUE(apply(message));
    number = 0;
    for (const auto& [kind, elements, columns] : cases)
        EXPECT_TRUE(line(++number).shows(columns + u" blend=0 Tag=1 delitem=0 tosend=A"_s)) << elements;
}

TEST_F(QuoteBody, TheIndicatorSaysWhatHappensToTheLine)
{
    for (const auto& [indicator, number, left, first] : casesIn<4>("inbound/indicators.txt"))
        for (const QString& kind : {u"labour"_s, u"part"_s, u"paint"_s, u"sublet"_s}) {
            gConn->execute(u"DELETE FROM QUOTE2"_s);
            quote("500").line(1, "R&R", "old");
            quote("500").line(2, "PRT");
            EXPECT_TRUE(apply(body().line(kind, number.toInt(), indicator, {{kind + u"Description"_s, "new"}})));
            EXPECT_EQ(numbers() + ' ' + line(1).text("script"), (left + u' ' + first).toStdString())
                << indicator << number;
        }
}

TEST_F(QuoteBody, ALineWithoutIndicatorDoesAsTheOneBeforeItInItsSection)
{
    for (int number = 1; number <= 4; ++number)
        line(number);
    const auto change = {std::pair<Text, Text>("labourDescription", "changed")};
    EXPECT_TRUE(apply(
        body().labour(1, "C", change).labour(2, "", change).labour(3, "N", change).labour(4, "", change).part(1, "")));
    EXPECT_EQ(line(2).text("script"), "changed");
    EXPECT_EQ(line(4).text("script"), "Front bumper bar");
    EXPECT_EQ(numbers(), "1 2 3 4 1");  // there is no line before the first part, so it is added
}

TEST_F(QuoteBody, AnUnknownIndicatorFailsTheBodyBeforeAnyLineIsTouched)
{
    line(1);
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
    EXPECT_TRUE(line(1).shows("category=OPG pthour=50 opg_rate=1 blend=2 allow_tick=3 itemno=153"));
    EXPECT_TRUE(line(2).shows("script=L/H lamp SIDE=R qty=3 Report=1 MARK=C"));
    EXPECT_TRUE(line(3).shows("script=Glass VENDOR=17 unitcost=44 Report_on=1"));
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody knows'"), 0);
}

TEST_F(QuoteBody, TheRepairerOfANewSubletLineIsFoundOrAdded)
{
    vendor("O'Hara & Sons Glass (Wattlebridge)");
    EXPECT_TRUE(
        apply(body()
                  .sublet(1, "I", {{"subletRepairer", "o'hara & sons"}})
                  .sublet(2, "I", {{"subletRepairer", std::string(50, 'n')}})
                  .sublet(3, "", {{"subletRepairer", "kept"}, {"subletRepairerAddress", std::string(120, 's')}})));
    EXPECT_EQ(line(1).number("VENDOR"), vendor("O'Hara & Sons Glass (Wattlebridge)").id());
    const Row added("VENDOR", "NAME='" + std::string(49, 'n') + "'");
    EXPECT_EQ(line(2).text("VENDOR"), added.text("VENDOR_ID"));
    EXPECT_TRUE(added.shows(
        "STREET=8 Foundry Lane PHONE=03 5550 1010 contact= SUBURB= Fax= accno= email= vendor_abn= Account=293"));
    // the line before it has "I", and the address is cut to the size of the column
    EXPECT_EQ(Row("VENDOR", "NAME='kept'").text("STREET"), std::string(100, 's'));

    EXPECT_TRUE(apply(body().sublet(1, "", {{"subletRepairer", "Nobody"}}), "501"));
    EXPECT_TRUE(quote("501").line(1).shows("category=MIS tosend=- directbill=-"));
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody'"), 0);
}

TEST_F(QuoteBody, ARepairerIsFoundAgainWhateverItsNameContains)
{
    vendor("Glass 1000 Co");
    vendor("Glass X Co");
    const std::string cut(48, 'n');
    int number = 0;
    for (const std::string& name : {std::string("Track "), cut + " & Sons", std::string("[GT] Repairs"),
                                    std::string("100% Co"), std::string("Glass _ Co"), std::string("O'Hara [%_]")}) {
        number += 2;
        EXPECT_TRUE(apply(body().sublet(number, "I", {{"subletRepairer", name}})));
        EXPECT_TRUE(apply(body().sublet(number + 1, "I", {{"subletRepairer", name}})));
        EXPECT_EQ(line(number).text("VENDOR"), line(number + 1).text("VENDOR")) << name;
        EXPECT_EQ(Row("VENDOR", "VENDOR_ID=" + line(number).text("VENDOR")).text("NAME"), name.substr(0, 49)) << name;
    }
}

TEST_F(QuoteBody, ASubletElementThatIsMissingKeepsTheOneOfTheLineBefore)
{
    EXPECT_TRUE(apply(body()
                          .sublet(1, "I", {{"subletDescription", "Glass"}})
                          .sublet(2, "I")
                          .without("quoteBody/sublets/sublet[2]/subletDescription")
                          .without("quoteBody/sublets/sublet[2]/subletRepairer")));
    EXPECT_TRUE(line(2).shows("script=Glass VENDOR=" + line(1).text("VENDOR")));
}

TEST_F(QuoteBody, ADocumentIsStoredUnderItsLinesNumber)
{
    EXPECT_TRUE(apply(withDocument(4, "I", "JVBE \nRi0x")));
    EXPECT_TRUE(gbSubletDocumentArrived);
    EXPECT_EQ(files::readBytes(subletFolder() + u"500.0_4.pdf"_s), "%PDF-1");

    files::write(subletFolder() + u"500.0_12.PDF"_s, u"of line 12"_s);
    files::write(subletFolder() + u"500.1_30.pdf"_s, u"of a supplementary quote"_s);
    EXPECT_TRUE(apply(withDocument(4, "N")));  // a second document for the same line
    EXPECT_TRUE(apply(withDocument(5, "D")));
    EXPECT_EQ(documents().join(u' '), u"500.0_12.PDF 500.0_13.pdf 500.0_4.pdf 500.0_5.pdf 500.1_30.pdf"_s);
    EXPECT_EQ(numbers(), "4");
}

TEST_F(QuoteBody, ALineWithoutNumberTakesOneThatIsFree)
{
    line(2);
    EXPECT_TRUE(apply(withDocument(0, "I")));
    files::write(subletFolder() + u"77.0_17.pdf"_s, u"any quote's; its last digit counts"_s);
    files::write(subletFolder() + u".9.pdf"_s, u"hidden"_s);
    files::write(subletFolder() + u"9.txt"_s, u"no document"_s);
    EXPECT_TRUE(apply(withDocument(0, "I")));
    EXPECT_EQ(numbers(), "2 3 8");

    // in a quote without lines, the number follows that of the line before
    EXPECT_TRUE(apply(body().sublet(40, "N").sublet(0, "N", {{"subletAuthorityDocument", pdf}}), "501"));
    EXPECT_TRUE(documents().contains(u"501.0_41.pdf"_s));
}

TEST_F(QuoteBody, ADocumentThatCannotBeStoredFailsTheBody)
{
    for (const char* broken : {"JVBERi0", "JVBE*i0x", "%PDF-1"}) {
        EXPECT_FALSE(apply(withDocument(1, "I", broken)));
        EXPECT_FALSE(shown().empty());
    }
    quote("5/../0").line(1);
    EXPECT_FALSE(apply(withDocument(1, "C"), "5/../0"));
    EXPECT_FALSE(gbSubletDocumentArrived);
    EXPECT_TRUE(documents().isEmpty());
}

TEST_F(QuoteBody, ADocumentMayBeThirtyMegabytesLong)
{
    EXPECT_TRUE(apply(withDocument(1, "I", QString(30 * 1024 * 1024, u'A'))));
    EXPECT_EQ(files::size(subletFolder() + u"500.0_1.pdf"_s), 30 * 1024 * 1024 / 4 * 3);
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
    EXPECT_TRUE(apply(body().labour(0, "I"), "n1"));  // after a load into another quote
    EXPECT_EQ(numbers("n2"), "4 5");
    EXPECT_EQ(numbers("n1"), "7 8 9 90 10 91");
}

TEST_F(QuoteBody, ItemNumbersComeFromThePoolOfTheCategory)
{
    for (const auto& [category, size, first, last] : casesIn<4>("inbound/item-numbers.txt")) {
        const int count = size.toInt();
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        for (int number = 1; number <= count + 2; ++number)
            quote("500").line(number, category);
        QStringList given;
        for (db::Recordset lines = opened(u"SELECT * FROM QUOTE2"_s); !lines.eof(); lines.moveNext()) {
            const QString number = lines.text(u"SEQ_NO"_s);
            given += NextItemNo(lines);
            EXPECT_EQ(lines.text(u"SEQ_NO"_s), number);  // the current line has not changed
            lines.set(u"itemno"_s, given.last());
        }
        EXPECT_EQ(given.first() + given[qMax(0, count - 1)], first + last) << category;
        EXPECT_EQ(given.mid(count), QStringList(2, u"999"_s)) << category;
        EXPECT_EQ(given.removeDuplicates(), 1) << category;
    }
}

TEST_F(QuoteBody, AValueThatDoesNotConvertEndsTheBodyAtItsLine)
{
    for (const auto& [kind, indicator, elements] : casesIn<3>("inbound/wrong-lines.txt")) {
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        EXPECT_FALSE(apply(body().labour(1, "I").line(kind, 2, indicator, fieldsIn(elements)).sublet(3, "I")));
        EXPECT_FALSE(shown().empty());
        EXPECT_EQ(numbers(), "1") << elements;
    }
    EXPECT_FALSE(apply(body().labour(4, "D").labour(5, "I").without("quoteBody/gst")));
    EXPECT_EQ(numbers(), "1");
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
    EXPECT_TRUE(line(70000).shows("qty=-2 unitcost=-1000 rrhour=-1250"));
    EXPECT_EQ(line(6).text("script"), "the first of them");
}

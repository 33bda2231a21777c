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
    QStringList found;
    for (const QSqlRecord& row : plainRows(u"SELECT * FROM QUOTE2 WHERE QTNNO='%1' ORDER BY itemid"_s.arg(number)))
        found += plainText(row.value(u"SEQ_NO"_s));
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

TEST_F(QuoteBody, LinesAreMergedAsTheTableSays)
{
    QString number = u"500"_s;
    for (const auto& [before, lines, after] : casesIn<3>("inbound/lines.txt")) {
        number = number == "500"_L1 ? u"501"_s : u"500"_s;  // numbers go on only within one quote
        gConn->execute(u"DELETE FROM QUOTE2"_s);
        for (const QString& line : before.split(u"; "_s, Qt::SkipEmptyParts))
            fill(quote(number).line(line.section(u' ', 0, 0).toInt(), line.section(u' ', 1, 1)), line.section(u' ', 2));
        Message message = body();
        for (const QString& line : lines.split(u"; "_s))
            message.line(line);
        QStringList left = after.split(u"; "_s);
        const bool isTaken = !left.removeOne(u"failed"_s);
        EXPECT_EQ(apply(message, number), isTaken) << lines;
        EXPECT_EQ(shown().empty(), isTaken) << lines;
        const std::string stored = numbers(number);
        QStringList expected;
        for (const QString& line : left) {
            expected += line.section(u' ', 0, 0);
            EXPECT_TRUE(quote(number).line(expected.last().toInt()).shows(line.section(u' ', 1))) << lines;
        }
        EXPECT_EQ(stored, expected.join(u' ').toStdString()) << lines;
    }
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody knows'"), 0) << "a change adds no vendor";
}

TEST_F(QuoteBody, TheRepairerOfANewSubletLineIsFoundOrAdded)
{
    for (const char* known : {"O'Hara & Sons Glass (Wattlebridge)", "Glass 1000 Co", "Glass X Co"})
        vendor(known);
    for (const auto& [repairer, name] : casesIn<2>("inbound/repairers.txt"))
        for (int twice = 0; twice < 2; ++twice) {
            gConn->execute(u"DELETE FROM QUOTE2"_s);
            EXPECT_TRUE(apply(body().sublet(1, "I", {{"subletRepairer", repairer}})));
            EXPECT_EQ(Row("VENDOR", "VENDOR_ID=" + line(1).text("VENDOR")).text("NAME"), name.toStdString());
            EXPECT_EQ(rowCount("VENDOR", sql("NAME='{}'", name)), 1);
        }
    EXPECT_TRUE(vendor("[GT] Repairs")
                    .shows("STREET=8 Foundry Lane PHONE=03 5550 1010 contact= SUBURB= Fax= accno= email= vendor_abn= "
                           "Account=293"));
    // the line before it has "I", and the address is cut to the size of the column
    EXPECT_TRUE(apply(body().sublet(2, "I").sublet(
        3, "", {{"subletRepairer", "kept"}, {"subletRepairerAddress", std::string(120, 's')}})));
    EXPECT_EQ(Row("VENDOR", "NAME='kept'").text("STREET"), std::string(100, 's'));

    EXPECT_TRUE(apply(body().sublet(1, "", {{"subletRepairer", "Nobody"}}), "501"));
    EXPECT_TRUE(quote("501").line(1).shows("category=MIS tosend=- directbill=-"));
    EXPECT_EQ(rowCount("VENDOR", "NAME='Nobody'"), 0);
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

// Tests which report a message gets, with which values, and which box appears if it gets none.
#include "messagelist/frmMessageList.h"
#include "reports/Previews.h"

using Printing = Previews;

TEST_F(Printing, ARequestShowsOneRowForEachImage)
{
    quote("500").request("QR1", "1");
    quote("501").request("QR1", "1");  // the oldest one is used
    files::write(gsUnreadPath + u"QR1_001.txt"_s, u"  Bumper & grille, L/H  \r\n"_s);
    files::write(gsUnreadPath + u"QR1_002.txt"_s, u""_s);
    Message request = quoteRequest("QR1").images({"1", "002", "3"});
    request.rego(" tba ")
        .set("offsiteQuoting", "TRUE")
        .set("vehicleLocation", "Behind the second shed on the left-hand side of the yard");
    report::setOutputFolder(root() + u"/out"_s);
    print(request);
    const QString page = pdfText(root() + u"/out/1-710.pdf"_s);
    for (const QString& text : {u"Quote request QR1"_s, u"Mr Alex Tarrant"_s, u"Reversed into a bollard"_s,
                                u"Rear bumper"_s, u"Quote from photographs"_s, u"Bumper & grille, L/H"_s})
        EXPECT_TRUE(page.contains(text)) << text;
    const QJsonObject window = onlyWindow();
    EXPECT_EQ(window[u"report"].toInt(), 710);
    EXPECT_EQ(window[u"parameters"].toObject(), (QJsonObject{{u"Comp"_s, u""_s}}));
    ASSERT_EQ(window[u"table"][u"rows"].toArray().size(), 3);
    for (int row = 0; row < 3; ++row)
        for (const auto& [field, value] : casesIn<2>("reports/request.txt"))
            EXPECT_EQ(cells(window, row, field), value.toStdString()) << field;
    EXPECT_EQ(cells(window, 0, "image_id image_desc"), "1|Bumper & grille, L/H");
    EXPECT_EQ(cells(window, 1, "image_id image_desc") + cells(window, 2, "image_id image_desc"), "2|3|");
}

TEST_F(Printing, ValuesOfARequestAreMadeFromWhatTheMessageHolds)
{
    quote("500").request("QR1");
    for (const auto& [elements, fields, expected] : casesIn<3>("reports/request-values.txt")) {
        print(quoteRequest("QR1").with(elements));
        EXPECT_EQ(cells(onlyWindow(), 0, fields), expected.toStdString()) << elements;
    }
}

TEST_F(Printing, AResultShowsItsReasonForTheOneQuoteOfTheRequest)
{
    quote("500", 2).request("QR1");
    for (const auto& [code, reason] :
         {std::pair("UNSP", "Unspecified Reason"), {"inco", "Quote Incomplete"}, {"TLSS", "-"}}) {
        print(assessmentResult("KQ1").reason(code));
        const QJsonObject window = onlyWindow();
        EXPECT_EQ(window[u"report"].toInt(), 720);
        EXPECT_EQ(window[u"parameters"].toObject(),
                  (QJsonObject{{u"Comp"_s, u""_s}, {u"Title"_s, u"Assessment Result"_s}}));
        EXPECT_EQ(cells(window, 0, "KESTQuoteNo QTNNO subquote KESTQRNO reason"),
                  std::string("KQ1|500|2|QR1|") + reason);
    }
    quote("501").request("QR1");
    print(assessmentResult("KQ1"));
    EXPECT_EQ(shownReports(), "");
    EXPECT_EQ(shown(), "[critical] Failed Matching Quote. Please contact MarlinDesk Support");
}

TEST_F(Printing, EachTypeHasItsReportOrNone)
{
    const QString folder = root() + u"/out"_s;
    quote("500").request("QR1").line(1);
    quote("502").request("", "");
    EXPECT_FALSE(PrintXML(u"gone.xml"_s, true));
    EXPECT_EQ(shown().substr(0, 67), "[none] An error 53 has occured, Please contact MarlinDesk Support\r\n");
    EXPECT_TRUE(PrintXML({}, true));
    print(marker("500"));
    print(Message("adqt", "getAdjustedQuoteResponse"));
    EXPECT_EQ(shownReports() + shown(), "");
    report::setOutputFolder(folder);
    for (const auto& [message, number, name, box] : casesIn<4>("reports/reports.txt")) {
        print(Message::told(message));
        EXPECT_EQ(shown(), box.toStdString()) << message;
        EXPECT_EQ(shownReports(), number.isEmpty() ? "" : "frmPrintPreview" + number.toStdString()) << message;
        const QStringList files = filesIn(folder).filter(u".pdf"_s);
        EXPECT_EQ(files.isEmpty() ? QString() : pdfValue(folder + u'/' + files.last()), name) << message;
        for (const QString& file : filesIn(folder))
            files::remove(folder + u'/' + file);
    }
    print(adjustedQuote("500").without("assessmentComment"));
    EXPECT_EQ(shown().substr(0, 67), "[none] An error 91 has occured, Please contact MarlinDesk Support\r\n");
}

TEST_F(Printing, TheListWindowReprintsItsReadMessages)
{
    quote("500").request("QR1").line(1, "PRT").set("qty", 1.0);
    files::write(gsReadPath + u"a.xml"_s, authorisedQuote("500").part(1, "D").text());
    frmMessageList window;
    window.openUnread();
    window.chooseFolder(MessageFolder::Read);
    EXPECT_TRUE(window.reprintFile(u"a.xml"_s));
    EXPECT_EQ(cells(onlyWindow(), 0, "action"), "N") << "the deleted line is left out";
}

TEST_F(Printing, EachChangedLineStandsInItsSection)
{
    quote("500").request("QR1");
    const auto lines = casesIn<5>("reports/sections.txt");
    for (const auto& [shop, kind, number, indicator, elements] : lines)
        if (!shop.isEmpty())
            fill(quote("500").line(number.toInt()), shop);
    addRow("SUBLET", {{"Sublet", 1}, {"Type", "OTH"}});
    report::setOutputFolder(root() + u"/out"_s);
    for (Message message : {authorisedQuote("500"), adjustedQuote("500")}) {
        for (const auto& [shop, kind, number, indicator, elements] : lines)
            message.line(kind, number.toInt(), indicator, fieldsIn(elements));
        print(message, false);
    }
    print(adjustedQuote("500"));
    for (const QString& file : {u"/out/1-730.pdf"_s, u"/out/2-730.pdf"_s}) {
        QString section;
        int count = 0;
        for (const QString& line : pdfText(root() + file).split(u'\n')) {
            const QString heading = line.section(u' ', 0, 0).trimmed();
            if (!heading.isEmpty() && heading != "Line"_L1)
                section = heading;
            static const QRegularExpression script(u"(Labour|Parts|Paint|Sublet) (deleted|other|unknown|bare|kept)"_s);
            const auto found = script.match(line);
            count += found.hasMatch() ? 1 : 0;
            EXPECT_TRUE(!found.hasMatch() || found.captured(1) == section) << file << line;
        }
        EXPECT_EQ(count, 12) << file;
        const QString gone = pdfText(root() + file).section(u"Deleted, not in this quote"_s, 1);
        EXPECT_EQ(gone.count(u"This quote has no line of that number."_s), 4) << "86 to 89 of " << file;
    }
    const QString unchanged = pdfText(root() + u"/out/3-730.pdf"_s);
    EXPECT_TRUE(unchanged.contains(u"No line of this quote was changed or added"_s));
    EXPECT_FALSE(unchanged.contains(u"Authorised"_s));
}

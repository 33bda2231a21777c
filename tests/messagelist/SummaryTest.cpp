// Tests the rows of the message list: what each shows, and which messages are held back.
#include "support/Shop.h"

struct MessageList : Shop {
    /// Returns the rows of a fill, one on each line: "file: type|rego|claim|customer|quote|vehicle".
    std::string filled(MessageFolder folder = MessageFolder::Unread)
    {
        QStringList lines;
        for (const ListedMessage& message : BuildMessageList(folder, FillHooks()))
            lines << message.file + u": "_s + QStringList(message.row.begin(), message.row.end()).join(u'|');
        return lines.join(u'\n').toStdString();
    }

    std::string row(const Text& message, const Text& name = "in.xml")
    {
        arrive(name, message);
        const std::string line = filled();
        files::remove(gsUnreadPath + name);
        return line.substr(std::min(line.size(), QString(name).toStdString().size() + 2));
    }

    static std::string listedFiles(MessageFolder folder = MessageFolder::Unread)
    {
        return listed(folder).join(u' ').toStdString();
    }
};

TEST_F(MessageList, AMessageShowsWhatItSays)
{
    quote("500", 2);
    for (const auto& [file, message, expected] : casesIn<3>("messages/rows.txt"))
        EXPECT_EQ(row(message.startsWith(u'<') ? message : Message::told(message).text(), file), expected.toStdString())
            << message;
    customer("Holloway").set("SALUTATION", nullptr);
    EXPECT_EQ(row(quoteMatch("123")), "Quote Matched to Quote Request|ABC123|7700001|-|123|Corella Meridian sedan")
        << "a name with a part that is Null is Null";
}

TEST_F(MessageList, OtherMessagesShowTheirQuote)
{
    const QString found = u"|ABC123|7700001|Ms Kim Holloway|500|CORELLA MERIDIAN GL"_s;
    files::write(gsReadPath + u"other.xml"_s, cancellation("QR9").text());
    quote("600").request("QR9");
    const auto expectRows = [&](const QString& ofOldest, const QString& ofNewest) {
        QStringList rows;
        for (const auto& [message, type, meant] : casesIn<3>("messages/quote-rows.txt")) {
            const QString file = QString::number(rows.size()) + u".xml"_s;
            files::write(gsReadPath + file, Message::told(message).text());
            rows << file + u": "_s + type + (meant == u"newest"_s ? ofNewest : ofOldest);
        }
        rows << u"other.xml: Quote Request Cancellation"_s + QString(found).replace(u"500"_s, u"600"_s);
        EXPECT_EQ(filled(MessageFolder::Read), rows.join(u'\n').toStdString());
    };
    expectRows(u"|-|-|-|-|-"_s, u"|-|-|-|-|-"_s);
    quote("500").request("QR1").quoteNumber("KQ1");
    expectRows(found, found);
    quote("500", 1).request("QR1").quoteNumber("KQ1").claim("88");
    expectRows(u"|-|-|-|-|-"_s, u"|ABC123|88|Ms Kim Holloway|500/1|CORELLA MERIDIAN GL"_s);
}

TEST_F(MessageList, AQuoteRowShowsWhatCanBeFound)
{
    quote("500").request("QR1").set("Claim", nullptr);
    car("ABC123").set("MODEL_ID", "no'ne").set("CUST_ID", nullptr);
    EXPECT_EQ(row(cancellation("QR1")), "Quote Request Cancellation|ABC123|-|-|500|-");
    quote("500").rego("NOCAR");
    EXPECT_EQ(row(cancellation("QR1")), "Quote Request Cancellation|-|-|-|-|-");
    gConn.reset();
    EXPECT_EQ(row(cancellation("QR1")), "Quote Request Cancellation|-|-|-|-|-");
}

TEST_F(MessageList, ASentQuoteShowsItsDocument)
{
    quote("500", 2);
    quote("500", 3).set("Claim", nullptr);
    for (const auto& [document, row] : casesIn<2>("messages/sent-rows.txt")) {
        const bool isSample = !document.startsWith(u'<');
        files::write(gsSentPath + u"a.xml"_s, isSample ? sentDocument(document) : document);
        const bool isReadable = row != "unreadable"_L1;
        EXPECT_EQ(filled(MessageFolder::Sent), isReadable ? "a.xml: Sent Quote|" + row.toStdString() : "") << document;
        EXPECT_EQ(shown(), isReadable ? "" : "[critical] Message a.xml unreadable, Please contact MarlinDesk Support.");
    }
}

TEST_F(MessageList, TwoFaultsOfATextAreRepairedInAnyFile)
{
    for (const char* name : {"a.xml", "b.xml", "c.xml"})
        EXPECT_EQ(row(QString(quoteRequest("QR1").claim("1&2").text()).replace(u"Corella"_s, u"Fish & Co"_s), name),
                  "Quote Request|XYZ789|1&amp;2|-|-|Fish & Co Meridian sedan")
            << "an entity is escaped a second time";
    arrive("e.xml", "<a/><b>R & D</b>");
    EXPECT_EQ(listedFiles(), "e.xml");
    EXPECT_EQ(shown(), "");
}

TEST_F(MessageList, WhatCannotBeReadHidesNothingElse)
{
    for (const char* name : {"a.XML", "b.xmlx", "c.txt", "dxml", "e\\f.xml", "g..xml"})  // two of them end in "xml"
        QFile(files::systemPath(gsUnreadPath) + u'/' + QString::fromLatin1(name)).open(QIODevice::WriteOnly);
    arrive("empty.xml", "");
    arrive("half.xml", "<a><b>");
    QFile huge(files::systemPath(gsUnreadPath) + u"/huge.xml"_s);
    ASSERT_TRUE(huge.open(QIODevice::WriteOnly) && huge.resize(xml::Document::maximumBytes + 1));
    arrive("last.xml", quoteRequest("QR1"));
    files::write(gsUnreadPath + u"Schrägstück \u20ac.xml"_s, quoteRequest("QR2").text());
    files::write(gsUnreadPath + u"\u043f\u0438\u0441\u044c\u043c\u043e.xml"_s, quoteRequest("QR3").text());

    EXPECT_EQ(listedFiles(), "last.xml Schrägstück \u20ac.xml \u043f\u0438\u0441\u044c\u043c\u043e.xml");
    QStringList expected;
    for (const char* name : {"dxml", "empty.xml", "g..xml", "half.xml", "huge.xml"})
        expected << u"Message %1 unreadable, Please contact MarlinDesk Support."_s.arg(QLatin1StringView(name));
    EXPECT_EQ(desktop->boxTexts(), expected);
}

TEST_F(MessageList, AFileThatHasGoneSinceTheListingIsPassedOver)
{
    for (const char* name : {"a", "b", "c"})
        arrive(std::string(name) + ".xml", cancellation(name));
    FillHooks hooks;
    hooks.progress = [](qint64 done, qint64) {
        if (done == 1)
            files::remove(gsUnreadPath + u"b.xml"_s);
        return true;
    };
    QStringList names;
    for (const ListedMessage& one : BuildMessageList(MessageFolder::Unread, hooks))
        names += one.file;
    EXPECT_EQ(names.join(u' '), u"a.xml c.xml"_s);
    EXPECT_EQ(shown(), "");
}

TEST_F(MessageList, ALostConnectionIsToldUnlessABoxGivesTimeToOpenIt)
{
    quote("500").request("QR1");
    arrive("b.xml", cancellation("QR1"));
    const std::string whole = filled();
    dropConnection();
    EXPECT_NE(filled(), whole);
    EXPECT_FALSE(takeRowFailure().isEmpty());
    arrive("a.xml", "<");
    EXPECT_EQ(filled() + takeRowFailure().toStdString(), whole) << "after the box";
    for (int number = 0; number < 26; ++number)
        files::write(gsReadPath + QString::number(number) + u".xml"_s, cancellation("QR1").text());
    dropConnection();
    EXPECT_NE(filled(MessageFolder::Read).find("25.xml: Quote Request Cancellation|ABC123|"), std::string::npos);
}

TEST_F(MessageList, ARequestWaitsUnreadForAllItsPictures)
{
    arrive("in.xml", quoteRequest("QR1").images({"1", " ", "22"}));
    EXPECT_EQ(listedFiles(), "");
    arrive("QR1_001.jpg", "picture");
    EXPECT_EQ(listedFiles(), "");
    arrive("qr1_022.JPG", "picture");
    EXPECT_EQ(listedFiles(), "in.xml");
    arrive("in.xml", quoteRequest("../AUnread/QR1").images({"1"}));
    EXPECT_EQ(listedFiles(), "") << "a name that leaves the folder is no picture";
    EXPECT_EQ(shown(), "");

    files::write(gsReadPath + u"in.xml"_s, quoteRequest("QR1").images({"7"}).text());
    EXPECT_EQ(listedFiles(MessageFolder::Read), "in.xml");
}

TEST_F(MessageList, WhatIsHeldBackTellsWhatItWaitsFor)
{
    arrive("a.xml", quoteRequest("QR1").images({"1", "2", "3"}));
    arrive("b.xml", quoteRequest("QR2").images({" ", ""}));
    arrive("c.xml", quoteRequest("QR3"));
    arrive("d.xml", cancellation("QR3"));
    arrive("e.xml", manualQuote("500").request("QR3"));
    arrive("f.xml", cancellation(""));
    arrive("g.xml", cancellation(""));
    arrive("MDMSG1.xml", "<note><subject>Hello</subject></note>");
    arrive("QR1_002.jpg", "picture");
    FillHooks hooks;
    QStringList held;
    hooks.held = [&](const HeldMessage& message) {
        held << message.file + u" ("_s + message.type + u"): "_s + message.waitsFor;
        EXPECT_LT(qAbs(message.since.secsTo(QDateTime::currentDateTime())), 60);
    };
    BuildMessageList(MessageFolder::Unread, hooks);
    EXPECT_EQ(held.join(u'\n').toStdString(),
              "a.xml (Quote Request): the pictures QR1_001.jpg, QR1_003.jpg\n"
              "b.xml (Quote Request): pictures that the request does not name\n"
              "d.xml (Quote Request Cancellation): c.xml, which must be loaded first\n"
              "c.xml (Quote Request): e.xml, which must be loaded first\n"
              "MDMSG1.xml (Note): nothing: it is a note, which is never listed");
    EXPECT_EQ(listedFiles(), "e.xml f.xml g.xml") << "one message of a request; a manual quote takes its place";
    for (const QString& name : filesIn(gsUnreadPath))
        files::move(gsUnreadPath + name, gsReadPath + name);
    EXPECT_EQ(listedFiles(MessageFolder::Read), "a.xml b.xml d.xml e.xml f.xml g.xml");
}

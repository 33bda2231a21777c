// Tests what all loads share: the parse, the choice of the loader, and reported failures.
#include "base/modLoggerEx.h"
#include "inbound/modLoadXML.h"
#include "messagelist/frmMessageList.h"
#include "platform/files/Background.h"
#include "platform/xml/FaultInjection.h"
#include "support/Shop.h"

using Dispatcher = Shop;

TEST_F(Dispatcher, ABareAmpersandIsRepairedOnce)
{
    quote("500").request("QR1");
    QString text =
        cancellation("QR1").reason("sold & gone &amp").text().replace(u"sold &amp; gone"_s, u"sold & gone"_s);
    EXPECT_TRUE(LoadXML(text, u"m.xml"_s));
    // text that is already escaped is escaped twice
    EXPECT_EQ(quote("500").notes(), "(today : QR Cancelled - sold & gone &amp;amp) (today : Cancelled Quote Request)");
    EXPECT_TRUE(text.contains(u"sold &amp; gone"_s));
}

TEST_F(Dispatcher, ALoadParsesItsMessageOnce)
{
    for (const char* told : {"QREQ quoteRequestNumber=QR9", "QMQR", "RRQT", "QRCN", "BCQR", "ADQT", "AUQT", "ARES",
                             "BACA", "EWAP", "MANQ", "QTDL"}) {
        quote("500").request("QR1").quoteNumber("KQ1").line(1).set("qty", 1.0);
        arrive("m.xml", Message::told(told));
        frmMessageList window;
        window.openUnread();
        int parses = 0;
        xml::setParseFault([&] {
            ++parses;
            return false;
        });
        EXPECT_TRUE(window.loadFile(u"m.xml"_s)) << told << shown();
        xml::setParseFault({});
        EXPECT_EQ(parses, 1) << told;
        EXPECT_EQ(filesIn(gsUnreadPath), QStringList()) << told;
    }
}

TEST_F(Dispatcher, AMessageThatDoesNotParseIsReportedInFiveLines)
{
    EXPECT_FALSE(load("<a>\n\t <b>\t1</c> </a>", "bad.xml"));
    const QString box = QString::fromStdString(shown());
    const QRegularExpression fiveLines(
        uR"(^\[critical\] KEST: Error loading XML file: bad\.xml\r\nError Code: -\d+\r\nReason: .+\r\n)"
        uR"(Source Text:\r\n<b>1</c> </a>$)"_s);
    EXPECT_TRUE(fiveLines.match(box).hasMatch()) << box;
}

TEST_F(Dispatcher, TheTypeDecidesInAnyCase)
{
    quote("500").request("QR1");
    EXPECT_TRUE(load(cancellation("QR1").text().replace(u">QRCN<"_s, u">qrcn<"_s)));
    EXPECT_EQ(quote("500").stage(), 9);
    EXPECT_FALSE(load(Message("NEWS", "getNewsResponse")));
    EXPECT_EQ(shown(), "");
}

TEST_F(Dispatcher, AFailingLogAddsNoBox)
{
    quote("500").request("QR1").line(1);
    QFile::remove(files::systemPath(errorLogPath()));
    files::makeFolder(errorLogPath());  // a folder with the name of the file
    arrive("m.xml", authorisedQuote("500").labour(1, "Z"));
    EXPECT_FALSE(loadAsTheWindow(u"m.xml"_s));
    const std::string boxes = shown();
    EXPECT_EQ(desktop->boxes().size(), 1) << boxes;
    EXPECT_NE(boxes.find("The change indicator \"Z\" is not known."), std::string::npos) << boxes;
    EXPECT_NE(boxes.find("The error log can't be written: Permission denied"), std::string::npos) << boxes;
}

TEST_F(Dispatcher, ANoticeIsPutAsideOnceItWasShown)
{
    EXPECT_FALSE(load(marker("501"), "x.xml"));
    EXPECT_TRUE(files::waitForBackground(5000));
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
    EXPECT_EQ(filesIn(gsReadPath), QStringList(u"MDMSG000.xml"_s));
    for (int number = 1; number <= 999; ++number)
        QFile(files::systemPath(gsReadPath) + u"/MDMSG%1.xml"_s.arg(number, 3, 10, QLatin1Char('0')))
            .open(QIODevice::WriteOnly);
    EXPECT_FALSE(load(marker("502"), "x.xml"));
    EXPECT_EQ(shown(), "[exclamation] Quote 501 was sent twice.\n[exclamation] Quote 502 was sent twice.");
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"x.xml"_s});
}

TEST_F(Dispatcher, AManualQuoteWithdrawsTheRequestThatItAnswers)
{
    const auto arriveAll = [&] {
        arrive("a.xml", quoteRequest("QR1"));
        arrive("b.xml", quoteRequest("QR2"));
        arrive("c.xml", cancellation("QR1"));
        arrive("d.xml", "<no xml");
        arrive("QR1_001.jpg", "\xff\xd8");
        arrive("R_500_0.xml", submissionResponse("KQ1"));
        QFile::setPermissions(files::systemPath(gsUnreadPath + u"a.xml"_s), QFile::ReadOwner);
        QFile(files::systemPath(gsUnreadPath) + u"/e\\f.xml"_s).open(QIODevice::WriteOnly);  // looks like a path
    };
    arriveAll();
    load(manualQuote("MANQ"));  // this test is not about the quote itself
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"b.xml c.xml d.xml e\\f.xml message.xml QR1_001.jpg R_500_0.xml"_s);

    arrive("b.xml", quoteRequest(" "));
    load(manualQuote("MANQ").request(" "));
    EXPECT_TRUE(filesIn(gsUnreadPath).contains(u"b.xml"_s)) << "an empty number matches nothing";

    // the clean-up compares the type in its exact case
    arriveAll();
    load(manualQuote("MANQ").text().replace(u">MANQ</messageType>"_s, u">manq</messageType>"_s));
    EXPECT_TRUE(filesIn(gsUnreadPath).contains(u"a.xml"_s));
}

TEST_F(Dispatcher, ATextLongerThanItsColumnIsRefusedBeforeAnythingIsStored)
{
    quote("500").request("QR1").set("excess", 400).line(1);
    quote("502").rego("ABC-123");
    car("ABC-123");
    for (const Message& message :
         {quoteRequest("QR2"), authorisedQuote("500").set("excess", "300"), manualQuote("502")}) {
        arrive("m.xml", Message(message).claim(std::string(200, '7')));
        const std::string held = holdings();
        EXPECT_FALSE(loadAsTheWindow(u"m.xml"_s));
        EXPECT_NE(shown().find("too long for the column Claim"), std::string::npos);
        EXPECT_EQ(difference(held, holdings()), "\n");
    }
}

#include "inbound/modLoadXML.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "shell/Helpers.h"
#include "shell/SharedVariables.h"
#include "shell/modLoggerEx.h"
#include "support/Load.h"
#include "support/Shop.h"

#include <QFile>

namespace kest::test {

using namespace Qt::StringLiterals;
using Dispatcher = Shop;

TEST_F(Dispatcher, ABareAmpersandIsRepairedOnce)
{
    quote("500").request("QR1");
    QString text =
        cancellation("QR1").reason("sold & gone &amp").text().replace(u"sold &amp; gone"_s, u"sold & gone"_s);
    EXPECT_TRUE(LoadXML(text, u"m.xml"_s));
    // what was escaped before is escaped twice
    EXPECT_EQ(quote("500").notes(), "(today : QR Cancelled - sold & gone &amp;amp) (today : Cancelled Quote Request)");
    EXPECT_TRUE(text.contains(u"sold &amp; gone"_s));
}

TEST_F(Dispatcher, AMessageThatDoesNotParseIsReportedInFiveLines)
{
    EXPECT_FALSE(load("<a>\n\t <b>\t1</c> </a>", "bad.xml"));
    const QStringList lines = QString::fromStdString(shown()).split(u"\r\n"_s);
    ASSERT_EQ(lines.size(), 5);
    EXPECT_EQ(lines[0], u"[critical] KEST: Error loading XML file: bad.xml"_s);
    EXPECT_TRUE(lines[1].startsWith(u"Error Code: -"_s)) << lines[1].toStdString();
    EXPECT_TRUE(lines[2].startsWith(u"Reason: "_s));
    EXPECT_EQ(lines[3], u"Source Text:"_s);
    EXPECT_EQ(lines[4], u"<b>1</c> </a>"_s);
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"bad.xml"_s});
}

TEST_F(Dispatcher, TheTypeDecidesInAnyCase)
{
    quote("500").request("QR1");
    EXPECT_TRUE(load(Message("qrcn", "getQRCancellationResponse",
                             {{"quoteRequestNumber", "QR1"}, {"qrCancellationReason", "sold"}})));
    EXPECT_EQ(quote("500").stage(), 9);
    EXPECT_FALSE(load(Message("NEWS", "getNewsResponse", {{"quoteRequestNumber", "QR1"}})));
    EXPECT_EQ(shown(), "");
}

TEST_F(Dispatcher, AFailureStandsInTheLog)
{
    EXPECT_FALSE(load(Message("", "getQRCancellationResponse", {})));
    EXPECT_TRUE(QString::fromStdString(shown()).startsWith(
        u"[critical] LoadXML: Line No: 0\r\nSource: modLoadXML.LoadXML\r\nError Number: 91\r\n"_s));
    EXPECT_TRUE(files::read(ErrorLogPath()).contains(u"Source: modLoadXML.LoadXML"_s));
}

TEST_F(Dispatcher, ANoticeIsShownAndPutAside)
{
    EXPECT_FALSE(load(marker("500"), "MDMSG7.xml"));
    EXPECT_FALSE(load(marker("501"), "x.xml"));
    EXPECT_EQ(shown(), "[exclamation] Quote 500 was sent twice.\n[exclamation] Quote 501 was sent twice.");
    EXPECT_TRUE(files::waitForBackground(5000));
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
    EXPECT_EQ(filesIn(gsReadPath), (QStringList{u"MDMSG000.xml"_s, u"MDMSG001.xml"_s}));

    for (int number = 2; number <= 999; ++number)
        QFile::copy(files::systemPath(gsReadPath + u"MDMSG000.xml"_s),
                    files::systemPath(gsReadPath) + u"/MDMSG%1.xml"_s.arg(number, 3, 10, QLatin1Char('0')));
    EXPECT_FALSE(load(marker("502"), "x.xml"));
    EXPECT_EQ(shown(), "[exclamation] Quote 502 was sent twice.");
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
    };
    arriveAll();
    load(manualQuote("MANQ"));  // another car is not there: the quote itself is not what matters here
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"b.xml c.xml d.xml message.xml QR1_001.jpg R_500_0.xml"_s);

    // the clean-up wants the type in its exact spelling
    arriveAll();
    load(manualQuote("MANQ").text().replace(u">MANQ</messageType>"_s, u">manq</messageType>"_s));
    EXPECT_TRUE(filesIn(gsUnreadPath).contains(u"a.xml"_s));
}

}  // namespace kest::test

#include "messages/Folders.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/Shop.h"

using namespace Qt::StringLiterals;

namespace kest::test {
namespace {

class MessageFolders : public Shop {
protected:
    /// The name that the message has in the read folder after its move.
    QString moved(const Text& message, const Text& arrivedAs = "in.xml")
    {
        arrive(arrivedAs, message);
        MoveMessage(arrivedAs, u"read"_s);
        EXPECT_TRUE(filesIn(gsUnreadPath).isEmpty()) << "still unread";
        const QStringList names = filesIn(gsReadPath);
        for (const QString& name : names)
            files::remove(gsReadPath + name);
        return names.join(u',');
    }
};

TEST_F(MessageFolders, ALoadedMessageIsNamedAfterItsQuote)
{
    quote("500").request("QR1", "1").quoteNumber("KQ1");
    quote("500", 2).request("QR1", "2").quoteNumber("KQ1");

    EXPECT_EQ(moved(quoteRequest("QR1").version("1")), u"500.xml"_s);
    EXPECT_EQ(moved(revisionRequest("QR1").version("2")), u"500.2_1.xml"_s);
    EXPECT_EQ(moved(cancellation("QR1")), u"500.2_1.xml"_s) << "the newest quote of the request";
    EXPECT_EQ(moved(cancellationBackout("QR1")), u"500.2_1.xml"_s);
    EXPECT_EQ(moved(assessmentBackout("QR1")), u"500.2_1.xml"_s);
    EXPECT_EQ(moved(assessmentResult("KQ1")), u"500.2_1.xml"_s) << "the last row of the network's number";
    EXPECT_EQ(moved(quoteDeletion("KQ1")), u"500.2_1.xml"_s);
    for (const Message& message :
         {quoteMatch("123/2"), manualQuote("123/2"), adjustedQuote("123/2"), authorisedQuote("123/2")})
        EXPECT_EQ(moved(message), u"123.2_1.xml"_s);
    EXPECT_EQ(moved(quoteMatch("123")), u"123.0_1.xml"_s);
}

TEST_F(MessageFolders, AMessageThatReachesNoQuoteKeepsItsName)
{
    quote("500").request("QR1", "1");
    for (const Message& message :
         {quoteRequest("QR1").version("2"), quoteRequest("QR9"), cancellation("Q'; DROP TABLE QUOTE1; --"),
          quoteRequest("QR1").without("quoteRequestVersionNumber"), assessmentResult("KQ9"), quoteMatch(""),
          excessWaiver("500"), quoteMatch("..\\..\\x"), quoteMatch("5/../../x"), quoteMatch("c:5")})
        EXPECT_EQ(moved(message), u"in.xml"_s) << message.text().toStdString();
    EXPECT_EQ(moved("no message"), u"in.xml"_s);
    EXPECT_EQ(moved(quoteMatch("a\tb"), "..two dots.xml"), u"..two dots.xml"_s);
    EXPECT_TRUE(quoteExists("500"));
}

TEST_F(MessageFolders, ADeletedOrMatchedQuoteNamesTheNextMessageOnce)
{
    gsDeletedQTNNO = u"77"_s;
    gsDeletedSubquote = u"1"_s;
    EXPECT_EQ(moved(quoteDeletion("gone")), u"77.1_1.xml"_s);
    EXPECT_EQ(moved(quoteDeletion("gone")), u"in.xml"_s);

    gsMatchedQTNNO = u"88"_s;
    EXPECT_EQ(moved(manualQuote("5/3")), u"88.0_1.xml"_s);
    EXPECT_EQ(moved(manualQuote("5/3")), u"5.3_1.xml"_s);
    gsMatchedQTNNO = u"88"_s;
    MoveMessage(u"in.xml"_s, u"print"_s);
    EXPECT_EQ(gsMatchedQTNNO, QString());
}

TEST_F(MessageFolders, TheRunningNumberCountsTheMessagesOfAQuoteAndSubquote)
{
    const struct {
        QStringList read;
        const char* reference;
        const char* name;
    } cases[] = {
        {{u"123.0_9.xml"_s, u"123.0_10.xml"_s}, "123", "123.0_11.xml"},
        {{u"123.0_1.xml"_s, u"123.xml"_s}, "12", "12.0_1.xml"},
        {{u"123.1_7.xml"_s}, "123", "123.0_1.xml"},
        {{u"a5.0_3.XML"_s}, "A5", "A5.0_4.xml"},
        {{u"123.0_32766.xml"_s}, "123", "123.0_32767.xml"},
        {{u"123.0_32767.xml"_s}, "123", ""},
        {{u"123.0_40000.xml"_s}, "123", ""},
        {{u"123.0_one.xml"_s}, "123", ""},
        {{u"123.0_.xml"_s}, "123", ""},
    };
    for (const auto& [read, reference, name] : cases) {
        for (const QString& file : read)
            files::write(gsReadPath + file, u"old"_s);
        EXPECT_EQ(GetMatchedFileName(QString::fromLatin1(reference)), QString::fromLatin1(name));
        for (const QString& file : read)
            files::remove(gsReadPath + file);
    }
}

TEST_F(MessageFolders, ARequestTakesThePlaceOfTheEarlierOneOrStaysUnread)
{
    quote("500").request("QR1");
    files::write(gsReadPath + u"500.xml"_s, u"old"_s);
    const QString text = quoteRequest("QR1").text();
    arrive("in.xml", text);
    MoveMessage(u"in.xml"_s, u"read"_s);
    EXPECT_EQ(files::read(gsReadPath + u"500.xml"_s), text);
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());

    gsReadPath = u"c:\\no such folder\\"_s;
    arrive("in.xml", quoteMatch("123"));
    MoveMessage(u"in.xml"_s, u"read"_s);
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"in.xml"_s});
}

}  // namespace
}  // namespace kest::test

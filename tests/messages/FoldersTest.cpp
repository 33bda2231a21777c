// Tests the names of messages in the read folder, and the move to it.
#include "messages/Folders.h"
#include "support/Shop.h"

struct MessageFolders : Shop {
    /// Moves a message and returns its name in the read folder.
    std::string moved(const Text& message, const Text& arrivedAs = "in.xml")
    {
        arrive(arrivedAs, message);
        MoveMessage(arrivedAs, u"read"_s);
        EXPECT_TRUE(filesIn(gsUnreadPath).isEmpty()) << "still unread";
        const QStringList names = filesIn(gsReadPath);
        for (const QString& name : names)
            files::remove(gsReadPath + name);
        return names.join(u',').toStdString();
    }
};

TEST_F(MessageFolders, ALoadedMessageIsNamedAfterItsQuote)
{
    quote("500").request("QR1", "1").quoteNumber("KQ1");
    quote("500", 2).request("QR1", "2").quoteNumber("KQ1");

    for (const auto& [message, name] : casesIn<2>("messages/read-names.txt"))
        EXPECT_EQ(moved(Message::told(message)), name.toStdString()) << message;
    EXPECT_EQ(moved("no message"), "in.xml");
    EXPECT_EQ(moved(quoteMatch("a\tb"), "..two dots.xml"), "..two dots.xml");
    EXPECT_TRUE(quoteExists("500"));
}

TEST_F(MessageFolders, ADeletedOrMatchedQuoteNamesTheNextMessageOnce)
{
    gsDeletedQTNNO = u"77"_s;
    gsDeletedSubquote = u"1"_s;
    EXPECT_EQ(moved(quoteDeletion("gone")), "77.1_1.xml");
    EXPECT_EQ(moved(quoteDeletion("gone")), "in.xml");

    gsMatchedQTNNO = u"88"_s;
    EXPECT_EQ(moved(manualQuote("5/3")), "88.0_1.xml");
    EXPECT_EQ(moved(manualQuote("5/3")), "5.3_1.xml");
    gsMatchedQTNNO = u"88"_s;
    MoveMessage(u"in.xml"_s, u"print"_s);
    EXPECT_EQ(gsMatchedQTNNO, QString());
}

TEST_F(MessageFolders, TheRunningNumberCountsTheMessagesOfAQuote)
{
    for (const auto& [read, reference, name] : casesIn<3>("messages/running-numbers.txt")) {
        for (const QString& file : read.split(u' '))
            files::write(gsReadPath + file, u"old"_s);
        EXPECT_EQ(GetMatchedFileName(reference), name) << read;
        for (const QString& file : read.split(u' '))
            files::remove(gsReadPath + file);
    }
}

TEST_F(MessageFolders, ARequestTakesThePlaceOfTheEarlierOne)
{
    quote("500").request("QR1");
    files::write(gsReadPath + u"500.xml"_s, u"old"_s);
    const QString text = quoteRequest("QR1").text();
    arrive("in.xml", text);
    MoveMessage(u"in.xml"_s, u"read"_s);
    EXPECT_EQ(files::read(gsReadPath + u"500.xml"_s), text);
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
}

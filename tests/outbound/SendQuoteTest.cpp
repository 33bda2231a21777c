// Tests which quotes are refused, what a send marks and writes, and its pictures.
#include "Sending.h"

static void empty(std::initializer_list<const char*> tables)
{
    for (const char* table : tables)
        gConn->execute(u"DELETE FROM "_s + QLatin1StringView(table));
}

TEST_F(Sending, ARefusalChangesNothing)
{
    for (const auto& [statements, message] : casesIn<2>("outbound/refusals.txt")) {
        QuoteRow row = sendable();
        for (const QString& statement : statements.split(u';'))
            gConn->execute(statement);
        const std::string before = row.exists() ? row.state() : "";
        EXPECT_EQ(send("500"), 0);
        EXPECT_EQ(shown(), "[critical] " + message.toStdString());
        EXPECT_EQ(row.exists() ? row.state() : "", before) << message;
        EXPECT_EQ(filesIn(gsUnsentPath), QStringList()) << message;
        empty({"QUOTE1", "QUOTE2", "QUOTE3", "CAR", "CUSTOMER"});
        gConn->execute(u"UPDATE INSURER SET KEST=1"_s);
    }
    sendable();
    gConn->execute(u"UPDATE CAR SET MODEL_ID='Z000'"_s);
    empty({"QUOTE3"});
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(), "[critical] Please Select a Make and Model for this car");
}

TEST_F(Sending, ASupplementaryQuoteGoesInPlaceOfItsMainQuote)
{
    sendable().quoteNumber("KQ7").locked(true).set("INSURER_ID", 99);
    sendable("500", 1).claim("0").request("QR1").note("Sending KEST Quote");

    EXPECT_EQ(send("500", 0), 110);
    EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.1_1.xml"_s));
    const auto element = [](const QString& path) { return sent(path, u"500.1_1.xml"_s); };
    EXPECT_EQ(element(u"kestAuthorisedQuoteNumber"_s), "KQ7");
    EXPECT_EQ(element(u"quoteRequestNumber"_s) + element(u"quoteExtraVehicleInformation"_s), "(none)(none)");
    EXPECT_EQ(quote("500", 1).notes(), "(today : Sending KEST Quote) (01/02/2008 : Sending KEST Quote)");

    quote("500", 1).locked(false).remarks("(01/02/2008 : Submitted KEST Quote)");
    EXPECT_EQ(send("500"), 0);
    quote("500", 1).remarks("");
    quote("500").set("KESTQuoteNo", nullptr);
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(),
              "[information] Quote Sent.\n"
              "[critical] This additional has already been submitted to ORLA, you cannot send a quote twice.\n"
              "[critical] The main quote has no ORLA quote number yet, this additional cannot be sent.");
    quote("500").quoteNumber("KQ1");
    quote("500", 1).authorised("  ");  // not empty, so the main quote's number does not take its place
    EXPECT_EQ(send("500"), 0);
    quote("500", 1).authorised(" A9 ");
    EXPECT_EQ(send("500"), 110);
    EXPECT_EQ(element(u"kestAuthorisedQuoteNumber"_s) + element(u"quoteBody/quoteType"_s), "A9S");
}

TEST_F(Sending, OnlyDocumentsThatHaveGoneOutCountForTheNumber)
{
    const auto again = [&] {
        sendable().locked(false);
        EXPECT_EQ(send("500"), 110);
    };
    again();
    again();
    EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.0_1.xml"_s));
    files::move(gsUnsentPath + u"500.0_1.xml"_s, gsSentPath + u"500.0_1.XML"_s);
    files::write(gsSentPath + u"500.0_3.xml"_s, {});
    again();
    files::move(gsUnsentPath + u"500.0_2.xml"_s, gsSentPath + u"500.0_2.xml"_s);
    again();
    EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.0_4.xml"_s));
}

TEST_F(Sending, AQuoteIsLockedOnlyWhenItsDocumentStands)
{
    for (const auto& [statement, number] : casesIn<2>("outbound/failures.txt")) {
        const QuoteRow row = sendable();
        const bool isDiskFull = statement == "a full disk"_L1;
        if (!isDiskFull)
            gConn->execute(statement);
        files::setFault([&] { return isDiskFull; });
        EXPECT_EQ(failureOf([] { send("500"); }), number.toInt()) << statement;
        files::setFault({});
        EXPECT_FALSE(row.locked()) << statement;
        EXPECT_EQ(filesIn(gsUnsentPath), QStringList()) << statement;
        EXPECT_EQ(shown(), "");
        empty({"QUOTE1", "QUOTE2", "QUOTE3"});
    }
}

TEST_F(Sending, AQuoteNumberCannotLeaveTheOutgoingFolder)
{
    sendable("..\\..\\x");
    EXPECT_THROW(send("..\\..\\x"), RuntimeError);
    EXPECT_FALSE(quote("..\\..\\x").locked());
    sendable("5'00");
    EXPECT_EQ(send("5'00"), 110);
}

TEST_F(Sending, ImagesGoOutWithTheirDocuments)
{
    for (const char* name : {"500_0012.jpg", "500_0003.JPG", "500_0x.jpg", "500_1001.jpg", "5001_0001.jpg"})
        files::write(gsImagesPath + QLatin1StringView(name), QLatin1StringView(name));
    gsImagesPath.chop(1);  // a shop may set the folder without a backslash at the end
    sendable();
    send("500");

    EXPECT_EQ(filesIn(gsUnsentPath), QStringList({u"500.0_1.xml"_s, u"I_500_0003.JPG"_s, u"I_500_0003.xml"_s,
                                                  u"I_500_0012.jpg"_s, u"I_500_0012.xml"_s}));
    EXPECT_EQ(sent(u"imageCount"_s) + ' ' + sent(u"quoteImageIds"_s), "2 312");
    EXPECT_EQ(outgoing(u"I_500_0003.JPG"_s), u"500_0003.JPG"_s);
    EXPECT_EQ(outgoing(u"I_500_0012.xml"_s),
              u"<request><kestQuoteNumber>500/0</kestQuoteNumber><quoteImageId>12</quoteImageId>"
              "<imageType>JPEG</imageType><imageDescription/></request>"_s);

    QDir(files::systemPath(gsImagesPath)).removeRecursively();
    sendable("600");
    shown();
    send("600");
    EXPECT_EQ(sent(u"imageCount"_s, u"600.0_1.xml"_s) + sent(u"quoteImageIds"_s, u"600.0_1.xml"_s), "0(none)");
    EXPECT_EQ(shown(),
              "[exclamation] The pictures' folder c:\\wirimg\\ was not found, so quote 600 is sent without pictures. "
              "Check the drive, and send the pictures to the insurer in another way.\n[information] Quote Sent.");
}

#include "Sending.h"
#include "outbound/SendQuote.h"
#include "platform/RuntimeError.h"
#include "platform/database/FaultInjection.h"
#include "platform/files/FaultInjection.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"

#include <QDir>

#include <functional>

namespace kest::test {

using namespace Qt::StringLiterals;

TEST_F(Sending, EachRefusalHasItsMessageAndChangesNothing)
{
    const struct {
        std::function<void(QuoteRow&)> change;
        const char* message;
    } cases[] = {
        {[](QuoteRow& q) { q.line(2, "PRT").set("qty", 0); },
         "Items with a Quantity of 0 cannot be sent to ORLA. Please check the quote details and try again."},
        {[](QuoteRow&) { anotherQuote("500"); },
         "A Critical Error has occured, Please contact MarlinDesk Support. 2 Records"},
        {[](QuoteRow& q) { q.locked(true).note("Cancelled Quote Request"); },
         "This quote request has been cancelled, Quote cannot be sent."},
        {[](QuoteRow& q) { q.locked(true); },
         "This quote has already been submitted to ORLA, you cannot send a quote twice."},
        {[](QuoteRow& q) { q.set("INSURER_ID", 99); }, "Could not locate Insurer! Please contact MarlinDesk Support."},
        {[](QuoteRow& q) { q.set("INSURER_ID", nullptr); },
         "Could not locate Insurer! Please contact MarlinDesk Support."},
        {[](QuoteRow&) { gConn->execute(u"UPDATE INSURER SET KEST=0"_s); },
         "Invalid Insurer, Please check the Insurer is valid & is marked as a KEST Insurer"},
        {[](QuoteRow& q) { q.set("msgno", "T1"); },
         "This quote has already been sent via TIDE, you cannot use KEST to send this quote."},
        {[](QuoteRow& q) { q.claim("none"); },
         "An Invalid claim number has been entered, please check the Claim Number and try again."},
        {[](QuoteRow& q) { q.set("Claim", nullptr); },
         "An Invalid claim number has been entered, please check the Claim Number and try again."},
        {[](QuoteRow& q) { q.rego("NOCAR"); }, "Error locating customer record, Quote cannot be sent."},
        {[](QuoteRow&) { customer("Holloway").set("NAME", ""); }, "Customer Name is Blank! Quote cannot be sent."},
        {[](QuoteRow& q) { q.request("QR1").note("Responded Quote Request"); },
         "Quote request is not marked as active, Quote cannot be sent."},
        {[](QuoteRow&) { car("ABC123").set("MODEL_ID", "Z000"); }, "Please Select a Make and Model for this car"},
        {[](QuoteRow&) { car("ABC123").set("MODEL_ID", nullptr); }, "Please Select a Make and Model for this car"},
        {[](QuoteRow& q) { q.set("CAR_IN", QDate(2024, 3, 2)).set("targetdate", QDate(2024, 3, 1)); },
         "Cannot have a target completion date before the start date. Please check the quote details."},
        {[](QuoteRow& q) { q.line(1).set("rrhour", 0); },
         "Error: Cannot send $0 variations to ORLA. Please call your assessor to discuss the variation."}};
    for (const auto& [change, message] : cases) {
        QuoteRow row = sendable();
        change(row);
        const bool locked = row.locked();
        const std::string notes = row.notes();
        EXPECT_EQ(send("500"), 0);
        EXPECT_EQ(shown(), std::string("[critical] ") + message);
        EXPECT_EQ(row.locked(), locked) << message;
        EXPECT_EQ(row.notes(), notes) << message;
        EXPECT_EQ(filesIn(gsUnsentPath), QStringList()) << message;
        for (const char* table : {"QUOTE1", "QUOTE2", "QUOTE3", "CAR", "CUSTOMER"})
            gConn->execute(u"DELETE FROM "_s + QLatin1StringView(table));
        gConn->execute(u"UPDATE INSURER SET KEST=1"_s);
    }
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(), "[critical] Quote not found in database, Please contact MarlinDesk Support.");
}

TEST_F(Sending, TheFirstReasonIsTheOneThatIsGiven)
{
    sendable().locked(true).set("INSURER_ID", 99).line(2, "PRT").set("qty", 0);
    send("500");
    EXPECT_EQ(shown().substr(0, 36), "[critical] Items with a Quantity of ");
    quote("500").line(2).set("qty", 1);
    send("500");
    EXPECT_EQ(shown(), "[critical] This quote has already been submitted to ORLA, you cannot send a quote twice.");
    quote("500").locked(false).claim("0");
    send("500");
    EXPECT_EQ(shown(), "[critical] Could not locate Insurer! Please contact MarlinDesk Support.");
}

TEST_F(Sending, AMainQuoteOfARequestIsLockedAndNoted)
{
    sendable().request("QR1", "2").note("Active Quote Request").claim("12A34");
    EXPECT_EQ(send("500"), 110);

    EXPECT_EQ(shown(), "[information] Quote Sent.");
    EXPECT_EQ(quote("500").notes(), "(today : Sending KEST Quote) (01/02/2008 : Responded Quote Request)");
    EXPECT_EQ(quote("500").stage(), 3);
    EXPECT_TRUE(quote("500").locked());
    EXPECT_EQ(quote("500").number("TOTAL"), 100);
    EXPECT_EQ(sent(u"quoteRequestNumber"_s), "QR1");
    EXPECT_EQ(sent(u"quoteRequestVersionNumber"_s), "2");
    EXPECT_EQ(sent(u"claimNumber"_s), "(none)");
    EXPECT_EQ(sent(u"kestAuthorisedQuoteNumber"_s), "(none)");
}

TEST_F(Sending, ASupplementaryQuoteGoesInPlaceOfItsMainQuote)
{
    sendable().quoteNumber("KQ7").locked(true).set("INSURER_ID", 99);
    sendable("500", 1).claim("0").request("QR1").note("Sending KEST Quote");

    EXPECT_EQ(send("500", 0), 110);
    EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.1_1.xml"_s));
    EXPECT_EQ(sent(u"kestAuthorisedQuoteNumber"_s, u"500.1_1.xml"_s), "KQ7");
    EXPECT_EQ(sent(u"quoteRequestNumber"_s, u"500.1_1.xml"_s), "(none)");
    EXPECT_EQ(sent(u"quoteExtraVehicleInformation"_s, u"500.1_1.xml"_s), "(none)");
    EXPECT_EQ(quote("500", 1).notes(), "(today : Sending KEST Quote) (01/02/2008 : Sending KEST Quote)");
    EXPECT_EQ(shown(), "[information] Quote Sent.");

    quote("500", 1).locked(false).remarks("(01/02/2008 : Submitted KEST Quote)");
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(), "[critical] This additional has already been submitted to ORLA, you cannot send a quote twice.");

    quote("500", 1).remarks("");
    quote("500").set("KESTQuoteNo", nullptr);
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(), "[critical] The main quote has no ORLA quote number yet, this additional cannot be sent.");

    quote("500", 1).authorised(" A9 ");
    EXPECT_EQ(send("500"), 110);
    EXPECT_EQ(sent(u"kestAuthorisedQuoteNumber"_s, u"500.1_1.xml"_s), "A9");
    EXPECT_EQ(sent(u"quoteBody/quoteType"_s, u"500.1_1.xml"_s), "S");
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
    const struct {
        const char* what;
        std::function<void(QuoteRow&)> change;
        int number;
    } cases[] = {{"a line without hours", [](QuoteRow& q) { q.line(1).set("rrhour", nullptr); }, NullValue},
                 {"a part without quantity", [](QuoteRow& q) { q.line(2, "PRT").set("qty", nullptr); }, NullValue},
                 {"no notes row", [](QuoteRow&) { gConn->execute(u"DELETE FROM QUOTE3"_s); }, NoCurrentRow},
                 {"a line number past the highest", [](QuoteRow& q) { q.line(32768).set("rrhour", 1); }, Overflow},
                 {"a full disk", [](QuoteRow&) { files::setFault([] { return true; }); }, FileInputOutput}};
    for (const auto& [what, change, number] : cases) {
        QuoteRow row = sendable();
        change(row);
        try {
            send("500");
            ADD_FAILURE() << what;
        } catch (const RuntimeError& error) {
            EXPECT_EQ(error.number(), number) << what << ": " << error.what();
        }
        files::setFault({});
        EXPECT_FALSE(row.locked()) << what;
        EXPECT_EQ(filesIn(gsUnsentPath), QStringList()) << what;
        EXPECT_EQ(shown(), "");
        for (const char* table : {"QUOTE1", "QUOTE2", "QUOTE3"})
            gConn->execute(u"DELETE FROM "_s + QLatin1StringView(table));
    }
}

TEST_F(Sending, AfterAFaultAtAnyStepTheQuoteCanBeSentAgain)
{
    sendable().request("QR1").note("Active Quote Request");
    db::Recordset panel(gConn);
    panel.open(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    int failing = 0;
    for (bool reached = true; reached; ++failing) {
        int statement = 0;
        db::setStatementFault([&] { return statement++ == failing; });
        attempt([&] { SendQuote(panel); });
        db::setStatementFault({});
        reached = statement > failing;
        EXPECT_EQ(panel.text(u"QTNNO"_s), u"500"_s) << failing;
        if (quote("500").locked()) {
            EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.0_1.xml"_s)) << failing;
            quote("500").locked(false).remarks("(01/02/2008 : Active Quote Request)");
        }
    }
    EXPECT_GT(failing, 30) << "as many statements as a send has";
    EXPECT_EQ(filesIn(gsUnsentPath), QStringList(u"500.0_1.xml"_s));
}

TEST_F(Sending, AQuoteNumberCannotLeaveTheOutgoingFolder)
{
    sendable("..\\..\\x");
    EXPECT_THROW(send("..\\..\\x"), RuntimeError);
    EXPECT_FALSE(quote("..\\..\\x").locked());
    sendable("5'00");
    EXPECT_EQ(send("5'00"), 110);
}

TEST_F(Sending, ImagesAreListedAndGoOutWithTheirDocuments)
{
    for (const char* name : {"500_0012.jpg", "500_0003.JPG", "500_0x.jpg", "500_1001.jpg", "5001_0001.jpg"})
        files::write(gsImagesPath + QLatin1StringView(name), QLatin1StringView(name));
    gsImagesPath.chop(1);  // a shop may set the folder without its last backslash
    sendable();
    send("500");

    EXPECT_EQ(filesIn(gsUnsentPath), QStringList({u"500.0_1.xml"_s, u"I_500_0003.JPG"_s, u"I_500_0003.xml"_s,
                                                  u"I_500_0012.jpg"_s, u"I_500_0012.xml"_s}));
    EXPECT_EQ(sent(u"imageCount"_s), "2");
    EXPECT_EQ(sent(u"quoteImageIds/quoteImageId[1]"_s), "3");
    EXPECT_EQ(sent(u"quoteImageIds/quoteImageId[2]"_s), "12");
    EXPECT_EQ(outgoing(u"I_500_0003.JPG"_s), u"500_0003.JPG"_s);
    EXPECT_EQ(outgoing(u"I_500_0012.xml"_s),
              u"<request><kestQuoteNumber>500/0</kestQuoteNumber><quoteImageId>12</quoteImageId>"
              "<imageType>JPEG</imageType><imageDescription/></request>"_s);

    QDir(files::systemPath(gsImagesPath)).removeRecursively();
    sendable("600");
    send("600");
    EXPECT_EQ(sent(u"imageCount"_s, u"600.0_1.xml"_s), "0");
    EXPECT_EQ(sent(u"quoteImageIds"_s, u"600.0_1.xml"_s), "(none)");
}

}  // namespace kest::test

// Tests the load of quote requests: the new quote, its number, car, customer and pictures.
#include "support/Shop.h"

struct Requests : Shop {
    static void run(const Text& statement) { gConn->execute(statement); }
    static Row cinfo() { return Row("CINFO", "1=1"); }
    static void insurers(const QString& names)
    {
        run("DELETE FROM INSURER");
        for (const QString& name : names.split(u", "_s, Qt::SkipEmptyParts))
            addRow("INSURER", {{"NAME", name}, {"KEST", 1}, {"M1_RATE", 46}});
    }
};

TEST_F(Requests, ARequestBecomesANewQuote)
{
    ASSERT_TRUE(load(quoteRequest("QR1")));
    EXPECT_EQ(shown(), "");

    EXPECT_TRUE(quote("1001").shows(
        "Subquote=0 KESTQRVer=1 Claim=7700001 REGO=XYZ789 qtndate=today RR_RATE=38 RA_RATE=42 paint_rate=46 QSENT=R "
        "excess=0 NEWPC=25 SECONDPC=15 RECOREPC=15 AFTERPC=20 excess_gst=1 TOTAL=0 kms=84200 quotechanged=1 "
        "invoiced=0 Type=MTA ExtraInfo=1 Job_stage=1 ReadOnly=- paint_override=0"));
    EXPECT_TRUE(car("XYZ789").shows(
        "KEST=1 MODEL_ID=Z000 BODY_ID=4 BODY_ID2=4S CYLINDERS=4 Year=07/2004 COLOUR=Blue VIN=6T1TESTVIN0000001 "
        "XMission=Automatic PAINT_GP=M1 CUST_ID=" +
        customer("Tarrant").text("CUST_ID")));
    EXPECT_TRUE(customer("Tarrant").shows("FIRSTNAME=Alex SALUTATION=Mr Account=190"));
    EXPECT_EQ(quote("1001").notes(), "(today : Active Quote Request)");
    EXPECT_EQ(cinfo().text("QUOTE_VAL"), "1002");

    EXPECT_FALSE(load(quoteRequest("QR1")));
    EXPECT_EQ(shown(), "[critical] Quote Request already exists as quote number 1001!");
    EXPECT_TRUE(load(quoteRequest("QR1").version("2")));
    EXPECT_EQ(quote("1002").text("KESTQRVer"), "2");
    EXPECT_EQ(quote("1001").notes(), "(today : Active Quote Request)");
}

TEST_F(Requests, TheUniversalInsurerIsPreferredAmongMany)
{
    int request = 0;
    for (const auto& [names, chosen] : casesIn<2>("inbound/insurers.txt")) {
        insurers(names);
        const Row made("QUOTE1", "KESTQRNo='QR" + std::to_string(++request) + "'");
        EXPECT_TRUE(load(quoteRequest("QR" + std::to_string(request))));
        EXPECT_EQ(made.text("INSURER_ID"), Row("INSURER", u"NAME='%1'"_s.arg(chosen)).text("INSURER_ID"));
        EXPECT_EQ(made.text("excess_gst"), "2") << "an insurer without a rule for the tax on the excess";
    }

    insurers({});
    EXPECT_FALSE(load(quoteRequest("QR98")));
    EXPECT_EQ(shown(), "[critical] Error locating a valid insurer, Please contact MarlinDesk Support.");
    insurers(u"A, B, C"_s);
    EXPECT_FALSE(load(quoteRequest("QR99")));
    EXPECT_NE(shown().find("Error Number: 3021"), std::string::npos);
}

TEST_F(Requests, TheCustomerIsFoundByNameOrMade)
{
    customer("O'Hara").set("FIRSTNAME", "Mary");
    customer("Fleet Co").set("FIRSTNAME", "");
    for (const auto& [elements, found] : casesIn<2>("inbound/customers.txt")) {
        const std::string key = "CAR" + std::to_string(rowCount("CAR"));
        const int before = rowCount("CUSTOMER");
        EXPECT_TRUE(load(quoteRequest(key).rego(key).with(elements)));
        EXPECT_EQ(rowCount("CUSTOMER"), before + (found == u"new"_s ? 1 : 0)) << elements;
        if (found != u"new"_s) {
            EXPECT_TRUE(car(key).shows("CUST_ID=" + customer(found).text("CUST_ID"))) << elements;
        }
    }
    // texts are cut to the size of the host's columns
    EXPECT_TRUE(load(quoteRequest("QR9").rego("SSS999").set("claimCustomer/surname", std::string(1000000, 's'))));
    EXPECT_EQ(Row("CUSTOMER", "NAME LIKE 'sss%'").text("NAME"), std::string(35, 's'));
}

TEST_F(Requests, AKnownCarKeepsEverythingButItsColoursSpelling)
{
    int number = 0;
    for (const auto& [before, after] : {std::pair("bLUE", "Blue"), std::pair("Mauve", ""), std::pair("", "")}) {
        car("ABC123").set("COLOUR", before).set("VIN", "OLD").set("KEST", 0);
        EXPECT_TRUE(load(quoteRequest("QR" + std::to_string(++number)).rego("ABC123")));
        EXPECT_TRUE(car("ABC123").shows(std::string("VIN=OLD KEST=1 COLOUR=") + after));
    }
    EXPECT_EQ(rowCount("CUSTOMER"), 1);

    // requests without a known registration share one car and its customer
    car("UNIVERSAL").set("CUST_ID", customer("Nobody").id());
    EXPECT_TRUE(load(quoteRequest("QR8").rego(" advise")));
    EXPECT_EQ(Row("QUOTE1", "KESTQRNo='QR8'").text("REGO"), "UNIVERSAL");
    // a car whose customer does not exist gets a new one
    car("GONE01").set("CUST_ID", 9999);
    EXPECT_TRUE(load(quoteRequest("QR9").rego("GONE01")));
    EXPECT_EQ(car("GONE01").number("CUST_ID"), customer("Tarrant").id());
}

TEST_F(Requests, AnEmptyRequestNumberIsNotKnown)
{
    quote("500").request("", "");
    EXPECT_TRUE(load(quoteRequest("").set("quoteRequestVersionNumber", "")));
    EXPECT_EQ(rowCount("QUOTE1", "KESTQRNo=''"), 2);
}

TEST_F(Requests, ACarWithoutAPaintGroupIsNamedWithTheColumn)
{
    car("ABC123").set("PAINT_GP", nullptr);
    EXPECT_FALSE(load(quoteRequest("QR1").rego("ABC123")));
    EXPECT_NE(shown().find("The column PAINT_GP of the car ABC123 is Null."), std::string::npos);
    EXPECT_EQ(rowCount("QUOTE1"), 0);
}

TEST_F(Requests, ANewCarTakesWhatTheMessageTells)
{
    for (const auto& [elements, columns] : casesIn<2>("inbound/new-cars.txt")) {
        const std::string key = "CAR" + std::to_string(rowCount("CAR"));
        EXPECT_TRUE(load(quoteRequest(key).rego(key).with(elements)));
        EXPECT_TRUE(car(key).shows(columns)) << elements;
    }
}

TEST_F(Requests, TheQuoteNumberIsTheNextThatIsFree)
{
    quote("1001");
    quote("1003");
    for (const auto& [counter, number, after] : casesIn<3>("inbound/quote-numbers.txt")) {
        run(u"UPDATE CINFO SET "_s + counter);
        EXPECT_TRUE(load(quoteRequest(number))) << shown();
        EXPECT_EQ(Row("QUOTE1", u"KESTQRNo='%1'"_s.arg(number)).text("QTNNO"), number.toStdString());
        EXPECT_EQ(cinfo().text("QUOTE_VAL"), after.toStdString());
    }

    run("UPDATE CINFO SET QUOTE_PRE='', QUOTE_VAL=NULL");
    EXPECT_FALSE(load(quoteRequest("QR9").rego("NEW1")));
    EXPECT_NE(shown().find("Error Number: 94"), std::string::npos);
    EXPECT_EQ(rowCount("QUOTE1", "QTNNO=''") + rowCount("CAR", "REGO='NEW1'"), 0);
}

TEST_F(Requests, PhotographsMoveIntoTheImagesFolder)
{
    for (const char* file : {"QR1_001.jpg", "QR1_001.txt", "QR1_012.jpg", "QR1_003.txt", "QR2_001.jpg"})
        arrive(file, file);
    for (const char* file : {"1001_0007.jpg", "1001_old.jpg", "10011_0020.jpg"})
        files::write(gsImagesPath + QString::fromLatin1(file), u"x"_s);

    EXPECT_TRUE(load(quoteRequest("QR1").images({"1", "3", "12", "../../x"})));

    EXPECT_EQ(filesIn(gsImagesPath).join(u' '),
              u"10011_0020.jpg 1001_0007.jpg 1001_0008.jpg 1001_0009.jpg 1001_old.jpg"_s);
    EXPECT_EQ(files::read(gsImagesPath + u"1001_0009.jpg"_s), u"QR1_012.jpg"_s);
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"message.xml QR1_003.txt QR2_001.jpg"_s);

    files::write(gsImagesPath + u"1002_0999.jpg"_s, u"x"_s);
    arrive("QR2_002.jpg", "second");
    EXPECT_TRUE(load(quoteRequest("QR2").images({"1", "2"})));
    EXPECT_EQ(files::read(gsImagesPath + u"1002_01000.jpg"_s), u"QR2_001.jpg"_s);
    EXPECT_EQ(files::read(gsImagesPath + u"1002_01001.jpg"_s), u"second"_s) << "behind 999 no picture is lost";
}

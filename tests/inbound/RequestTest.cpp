#include "inbound/modLoadXML.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "shell/SharedVariables.h"
#include "support/Load.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

class Requests : public Shop {
protected:
    static void run(const char* statement) { gConn->execute(QString::fromLatin1(statement)); }
    static Row cinfo() { return Row("CINFO", "1=1"); }
    static void insurers(std::initializer_list<const char*> names)
    {
        run("DELETE FROM INSURER");
        for (const char* name : names)
            gConn->execute(
                sql("INSERT INTO INSURER (NAME, KEST, M1_RATE) VALUES ('{}', 1, 46)", QString::fromLatin1(name)));
    }
};

}  // namespace

TEST_F(Requests, ARequestBecomesANewQuoteWithCarAndCustomer)
{
    ASSERT_TRUE(load(quoteRequest("QR1")));
    EXPECT_EQ(shown(), "");

    const struct {
        Row row;
        std::initializer_list<std::pair<const char*, const char*>> columns;
    } expected[] = {
        {Row("QUOTE1", "QTNNO='1001'"),
         {{"Subquote", "0"},      {"KESTQRNo", "QR1"},      {"KESTQRVer", "1"},    {"Claim", "7700001"},
          {"REGO", "XYZ789"},     {"RR_RATE", "38"},        {"RA_RATE", "42"},     {"paint_rate", "46"},
          {"QSENT", "R"},         {"excess", "0"},          {"NEWPC", "25"},       {"SECONDPC", "15"},
          {"RECOREPC", "15"},     {"AFTERPC", "20"},        {"excess_gst", "1"},   {"TOTAL", "0"},
          {"kms", "84200"},       {"quotechanged", "True"}, {"invoiced", "False"}, {"Type", "MTA"},
          {"ExtraInfo", "True"},  {"Job_stage", "1"},       {"ReadOnly", ""},      {"CONTACTID", "0"},
          {"paint_override", "0"}}},
        {Row("CAR", "REGO='XYZ789'"),
         {{"KEST", "1"},
          {"MODEL_ID", "Z000"},
          {"BODY_ID", "4"},
          {"BODY_ID2", "4S"},
          {"CYLINDERS", "4"},
          {"Year", "07/2004"},
          {"COLOUR", "Blue"},
          {"VIN", "6T1TESTVIN0000001"},
          {"XMission", "Automatic"},
          {"PAINT_GP", "M1"}}},
        {Row("CUSTOMER", "NAME='Tarrant'"), {{"FIRSTNAME", "Alex"}, {"SALUTATION", "Mr"}, {"Account", "190"}}},
    };
    for (const auto& [row, columns] : expected) {
        for (const auto& [column, value] : columns)
            EXPECT_EQ(row.text(column), value) << column;
    }
    EXPECT_EQ(Row("QUOTE1", "QTNNO='1001'").text("qtndate"), shortDate(QDate::currentDate()).toStdString());
    EXPECT_EQ(Row("CAR", "REGO='XYZ789'").text("CUST_ID"), Row("CUSTOMER", "NAME='Tarrant'").text("CUST_ID"));
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
    const std::pair<std::initializer_list<const char*>, const char*> cases[] = {
        {{"A"}, "A"},
        {{"A", "B"}, "A"},
        {{"A", "KEST Universal Insurer"}, "A"},
        {{"KEST Universal Insurer", "B"}, "B"},
        {{"A", "B", "KEST Universal Insurer", "C"}, "KEST Universal Insurer"},
    };
    int request = 0;
    for (const auto& [names, chosen] : cases) {
        insurers(names);
        const std::string number = "QR" + std::to_string(++request);
        EXPECT_TRUE(load(quoteRequest(number)));
        const Row insurer("INSURER", sql("NAME='{}'", QString::fromLatin1(chosen)));
        EXPECT_EQ(Row("QUOTE1", sql("KESTQRNo='{}'", QString::fromStdString(number))).text("INSURER_ID"),
                  insurer.text("INSURER_ID"))
            << chosen << " of " << names.size();
        // an insurer without a rule for the tax on the excess
        EXPECT_EQ(Row("QUOTE1", sql("KESTQRNo='{}'", QString::fromStdString(number))).text("excess_gst"), "2");
    }

    insurers({});
    EXPECT_FALSE(load(quoteRequest("QR98")));
    EXPECT_EQ(shown(), "[critical] Error locating a valid insurer, Please contact MarlinDesk Support.");
    insurers({"A", "B", "C"});
    EXPECT_FALSE(load(quoteRequest("QR99")));
    EXPECT_TRUE(QString::fromStdString(shown()).contains(u"Error Number: 3021"_s));
}

TEST_F(Requests, TheCustomerIsFoundByNameOrMade)
{
    customer("O'Hara").set("FIRSTNAME", "Mary");
    customer("Fleet Co").set("FIRSTNAME", "");
    const struct {
        const char* company;
        const char* first;
        const char* surname;
        const char* found;  // by this name; null where a new customer is made
    } cases[] = {
        {nullptr, "Mary Jane", "O'Hara", "O'Hara"}, {nullptr, "mary", " O'hara ", "O'Hara"},
        {nullptr, "Maryanne", "O'Hara", nullptr},   {nullptr, "Kim", "Fleet Co", nullptr},
        {"Fleet Co", "", "", "Fleet Co"},           {"Fleet", "", "", nullptr},
    };
    int number = 0;
    for (const auto& c : cases) {
        ++number;
        Message message = quoteRequest("QR" + std::to_string(number)).rego("CAR" + std::to_string(number));
        if (c.company)
            message.without("claimCustomer").set("claimCustomer/companyName", c.company);
        else
            message.set("claimCustomer/firstName", c.first).set("claimCustomer/surname", c.surname);
        const int before = rowCount("CUSTOMER");
        EXPECT_TRUE(load(message));
        EXPECT_EQ(rowCount("CUSTOMER"), before + (c.found ? 0 : 1)) << number;
        if (c.found) {
            EXPECT_EQ(Row("CAR", sql("REGO='{}'", u"CAR%1"_s.arg(number))).number("CUST_ID"), customer(c.found).id());
        }
    }
    EXPECT_EQ(customer("Fleet").text("FIRSTNAME"), "");
    // texts are cut to what the host's columns take
    EXPECT_TRUE(load(quoteRequest("QR9").rego("CAR9").set("claimCustomer/surname", std::string(1000000, 's'))));
    EXPECT_EQ(Row("CUSTOMER", "NAME LIKE 'sss%'").text("NAME"), std::string(35, 's'));
}

TEST_F(Requests, AKnownCarKeepsEverythingButItsColoursSpelling)
{
    const std::pair<const char*, const char*> colours[] = {{"bLUE", "Blue"}, {"Mauve", ""}, {"", ""}};
    int number = 0;
    for (const auto& [before, after] : colours) {
        car("ABC123").set("COLOUR", before).set("VIN", "OLD").set("KEST", 0);
        EXPECT_TRUE(load(quoteRequest("QR" + std::to_string(++number)).rego("ABC123")));
        EXPECT_EQ(car("ABC123").text("COLOUR"), after);
        EXPECT_EQ(car("ABC123").text("VIN"), "OLD");
        EXPECT_EQ(car("ABC123").text("KEST"), "1");
        EXPECT_EQ(car("ABC123").number("CUST_ID"), customer("Holloway").id());
    }
    EXPECT_EQ(rowCount("CUSTOMER"), 1);

    // requests without a known registration share one car, and with it its customer
    car("UNIVERSAL").customer("Nobody");
    EXPECT_TRUE(load(quoteRequest("QR8").rego(" advise")));
    EXPECT_EQ(Row("QUOTE1", "KESTQRNo='QR8'").text("REGO"), "UNIVERSAL");
    // a car whose customer has gone gets a new one
    car("GONE01").set("CUST_ID", 9999);
    EXPECT_TRUE(load(quoteRequest("QR9").rego("GONE01")));
    EXPECT_EQ(car("GONE01").number("CUST_ID"), customer("Tarrant").id());
}

TEST_F(Requests, ANewCarTakesWhatTheMessageTells)
{
    const struct {
        const char* element;
        const char* told;
        const char* column;
        const char* expected;
    } cases[] = {
        {"monthOfManufacture", "0", "Year", "01/2004"},
        {"monthOfManufacture", "x11", "Year", "11/2004"},
        {"yearOfManufacture", "", "Year", ""},
        {"transmissionType", "M", "XMission", "Manual"},
        {"transmissionType", "CVT", "XMission", "CVT"},
        {"transmissionType", "", "XMission", ""},
        {"numberOfCylinders", "V6", "CYLINDERS", "6"},
        {"numberOfCylinders", "", "CYLINDERS", ""},
        {"color", "MAUV", "COLOUR", ""},
        {"color", "", "COLOUR", ""},
        {"paintType", "SOLD", "PAINT_GP", "S1"},
        {"paintType", "CLER", "PAINT_GP", "S2"},
        {"paintType", "PEAR", "PAINT_GP", "M2"},
        {"paintType", "HARL", "PAINT_GP", "M3"},
        {"paintType", "meta", "PAINT_GP", "S3"},
    };
    int number = 0;
    for (const auto& c : cases) {
        const std::string rego = "CAR" + std::to_string(++number);
        EXPECT_TRUE(load(quoteRequest("QR" + std::to_string(number))
                             .rego(rego)
                             .set(std::string("extraVehicleInformation/") + c.element, c.told)));
        EXPECT_EQ(Row("CAR", "REGO='" + rego + "'").text(c.column), c.expected) << c.element << " " << c.told;
    }
}

TEST_F(Requests, TheQuoteNumberIsTheNextThatIsFree)
{
    quote("1001");
    quote("1003");
    EXPECT_TRUE(load(quoteRequest("QR1")));
    EXPECT_TRUE(quoteExists("1002"));
    EXPECT_EQ(cinfo().text("QUOTE_VAL"), "1004");

    // The counter follows from the number just used, which with a prefix or a suffix is no bare count.
    run("UPDATE CINFO SET QUOTE_PRE='9', QUOTE_VAL=50, QUOTE_SUF='7'");
    EXPECT_TRUE(load(quoteRequest("QR2")));
    EXPECT_TRUE(quoteExists("9507"));
    EXPECT_EQ(cinfo().text("QUOTE_VAL"), "9507");

    // One that the counter's column does not take fails the load after the quote has been made.
    run("UPDATE CINFO SET QUOTE_PRE='Q', QUOTE_VAL=50, QUOTE_SUF=''");
    EXPECT_FALSE(load(quoteRequest("QR3")));
    EXPECT_TRUE(quoteExists("Q50"));
    EXPECT_EQ(cinfo().text("QUOTE_VAL"), "50");
    EXPECT_TRUE(QString::fromStdString(shown()).contains(u"Error Number: 13"_s));

    run("UPDATE CINFO SET QUOTE_PRE='', QUOTE_VAL=700, QUOTE_SUF=''");
    const std::pair<const char*, const char*> given[] = {{"", "700"},          {"MANQ", "700"}, {"8", "700"},
                                                         {"123456789", "700"}, {"88", "88"},    {"1001", "701"}};
    quote("700");
    for (const auto& [wish, number] : given) {
        db::Recordset shop = Opened(u"SELECT * FROM CINFO"_s);
        db::Recordset tried(gConn);
        const QString expected = QString::fromLatin1(number) == u"700"_s ? u"701"_s : QString::fromLatin1(number);
        EXPECT_EQ(NextQuoteNumber(QString::fromLatin1(wish), shop, tried, false), expected) << wish;
        EXPECT_TRUE(tried.eof());
    }
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
}

}  // namespace kest::test

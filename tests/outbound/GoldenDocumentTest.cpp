// Whole quote documents, compared with the readable ones in golden/.
#include "Sending.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"

#include <QFile>

namespace kest::test {

using namespace Qt::StringLiterals;

class GoldenDocument : public Sending {
protected:
    static void expectDocument(const QString& file, const QString& name)
    {
        const QStringList actual = readAsXml(withRoot(outgoing(file)));
        QFile golden(QStringLiteral(KEST_SOURCE_DIR "/tests/outbound/golden/") + name);
        EXPECT_TRUE(golden.open(QIODevice::ReadOnly)) << name.toStdString();
        const QStringList expected = readAsXml(QString::fromUtf8(golden.readAll()));
        for (qsizetype i = 0; i < std::max(actual.size(), expected.size()); ++i)
            EXPECT_EQ(actual.value(i), expected.value(i)) << name.toStdString() << ", element " << i;
    }
};

TEST_F(GoldenDocument, AMainQuoteFromARequest)
{
    customer("Holloway").set("PHONE_P", "(02) 5550 1234").set("PHONE_B", " +61 2 5550 98765");
    car("ABC123").set("XMission", "a").set("CYLINDERS", 4).set("ENG_SIZE", "1.8L").set("VIN", " 6T1BD0001 ");
    QuoteRow row = quote("1201").request("QR88123", "2").note("Active Quote Request");
    row.set("kms", "84210").set("ExtraInfo", false);
    row.set("CAR_IN", QDate(2024, 2, 26)).set("targetdate", QDate(2024, 3, 4));
    row.remarks("Repairs < 1 week & \"guaranteed\",\r\ncaf\u00e9 next door", "P_REMARKS");
    for (const QString& name : {u"1201_0001.jpg"_s, u"1201_0012.jpg"_s, u"1201_1001.jpg"_s, u"120_0001.jpg"_s})
        files::write(gsImagesPath + name, u"a photograph"_s);

    addLine(row, "R&R", "Front bumper bar", {{"SEQ_NO", 1}, {"rrhour", 1.5}, {"rr_rate2", 33.33}});
    addLine(row, "R&R", "Headlamp \"left\"", {{"SEQ_NO", 2}, {"rrhour", 0.4}, {"rr_rate2", 38}});
    addLine(row, "RA", "Left guard", {{"SEQ_NO", 3}, {"rahour", 1.5}, {"rr_rate2", 33.33}});
    addLine(row, "PAINT", "Left guard", {{"SEQ_NO", 4}, {"pthour", 2.25}, {"rr_rate2", 46}});
    addLine(row, "PAINT", "Left front door ", {{"SEQ_NO", 5}, {"pthour", 1.1}, {"rr_rate2", 46}, {"blend", 1}});
    addLine(row, "PRT", "Bumper cover",
            {{"SEQ_NO", 6}, {"qty", 1}, {"unitcost", 240}, {"rrhour", 300}, {"PartNo", "52119-0"}, {"MARK", " "}});
    addLine(row, "PRT", "Headlamp",
            {{"SEQ_NO", 7}, {"qty", 1}, {"unitcost", 95.5}, {"rrhour", 110}, {"PartNo", "X1"}, {"MARK", "U"}});
    addLine(row, "MIS", "Wheel alignment",
            {{"SEQ_NO", 8},
             {"unitcost", 88},
             {"VENDOR", vendor("Straight & True Wheels of Wattlebridge").id()},
             {"PartNo", "WHAL"}});

    EXPECT_DOUBLE_EQ(send("1201"), 747.22);
    expectDocument(u"1201.0_1.xml"_s, u"main-from-request.xml"_s);
}

TEST_F(GoldenDocument, AMainQuoteWithAClaimAndTheExtraInformation)
{
    desktop.emplace(R"({"windows": {"frmExtraInfo": [[
        {"set": "txtVIN", "text": "6T1BD0002"}, {"set": "txtOdometer", "text": "120500"},
        {"set": "txtColour", "text": "gr"}, {"key": "txtColour", "keys": ["Return"]},
        {"set": "txtCylinders", "text": "6 cyl"}, {"set": "txtFuel", "text": "75"},
        {"set": "txtBuildMonth", "text": "11"}, {"set": "txtBuildYear", "text": "98"},
        {"set": "txtDamageDesc", "text": "Hit from behind"}, {"click": "Command1"}]]}})");
    car("ABC123").set("PAINT_GP", "m2");
    customer("Holloway").set("FIRSTNAME", "").set("SALUTATION", "").set("NAME", "Holloway Haulage");
    QuoteRow row = quote("777").claim(" C-5512 ").set("ExtraInfo", true).rego("ABC123");

    addLine(row, "R&R", "Tailgate", {{"rrhour", 2}, {"rr_rate2", 38}});
    addLine(row, "R&R", "Exhaust hanger", {{"rrhour", 0.75}, {"rr_rate2", 55.55}, {"PartNo", "M"}});
    addLine(row, "OPG", "Stone guard", {{"pthour", 0.5}, {"opg_rate", 31.01}, {"rr_rate2", 99}});
    addLine(row, "PRT", "Tail lamp, returned", {{"qty", -2}, {"unitcost", 100}, {"rrhour", 125}, {"PartNo", "81561"}});
    addLine(row, "PRT", "Tailgate", {{"qty", 1}, {"unitcost", 399.99}, {"rrhour", 399.99}, {"MARK", "X"}});
    addLine(row, "PRT", "Clips", {{"qty", 12}, {"rrhour", 1.1}, {"MARK", "?"}, {"PartNo", "none"}});
    addLine(row, "MIS", "Hazardous waste", {{"unitcost", 12.5}});
    addLine(row, "PRT", "Old scratch on roof", {{"qty", 1}, {"unitcost", 50}, {"rrhour", 60}, {"Report_on", 1}});

    EXPECT_DOUBLE_EQ(send("777"), 325.23);
    expectDocument(u"777.0_1.xml"_s, u"main-with-claim.xml"_s);
    EXPECT_EQ(car("ABC123").text("Year") + car("ABC123").text("COLOUR") + car("ABC123").text("CYLINDERS"),
              "11/1998Green6");
    EXPECT_EQ(quote("777").text("kms"), "120500");
}

TEST_F(GoldenDocument, ASupplementaryQuoteThatWasAuthorised)
{
    customer("Holloway").set("SALUTATION", nullptr).set("FIRSTNAME", nullptr);
    quote("1201").quoteNumber("KQ55");
    QuoteRow row = quote("1201", 1).authorised(" AU900 ").request("QR88123").set("CAR_IN", QDate(2024, 3, 4));
    const int trimmer = vendor("Seats Again").id();

    addLine(row, "RA", "Sill", {{"SEQ_NO", 7}, {"rahour", 120.5}, {"rr_rate2", 1}});
    addLine(row, "R&R", "Mirror", {{"SEQ_NO", 7}, {"rrhour", 45}, {"rr_rate2", 1}, {"delitem", true}});
    addLine(row, "MIS", "Seat trim", {{"SEQ_NO", 2}, {"unitcost", 210.4}, {"VENDOR", trimmer}, {"PartNo", "TRIM"}});
    addLine(row, "MIS", "Without charge", {{"SEQ_NO", 3}, {"unitcost", 0}, {"VENDOR", trimmer}});
    addLine(row, "R&R", "Seen on the hoist", {{"rrhour", 9}, {"rr_rate2", 9}, {"Report_on", 1}});

    EXPECT_DOUBLE_EQ(send("1201"), 413.49);
    expectDocument(u"1201.1_1.xml"_s, u"supplementary-authorised.xml"_s);
    // what is not sent is numbered all the same: the report item, and the trim again among the sublets
    const std::pair<const char*, const char*> numbers[] = {
        {"Mirror", "7"}, {"Sill", "8"}, {"Seen on the hoist", "1"}, {"Seat trim", "3"}, {"Without charge", "4"}};
    for (const auto& [script, number] : numbers)
        EXPECT_EQ(Row("QUOTE2", u"script='%1'"_s.arg(QLatin1StringView(script))).text("SEQ_NO"), number) << script;
}

TEST_F(GoldenDocument, AMainQuoteOfFortyLinesInEverySet)
{
    QuoteRow row = quote("A-40").request("QR40", "1").note("Active Quote Request");
    const int tower = vendor("Night and Day Towing").id();
    const char* places[] = {"bonnet", "left guard", "right guard", "left door", "right door"};
    for (int i = 0; i < 5; ++i) {
        const QString place = QString::fromLatin1(places[i]);
        const double hours = 0.35 + 0.85 * i;
        addLine(row, "R&R", u"Replace "_s + place, {{"SEQ_NO", 10 * i}, {"rrhour", hours}, {"rr_rate2", 38.15}});
        addLine(row, "RA", u"Repair "_s + place, {{"SEQ_NO", 10 * i + 1}, {"rahour", hours}, {"rr_rate2", 42.35}});
        addLine(row, "R&R", u"Align "_s + place, {{"rrhour", hours}, {"rr_rate2", 61.05}, {"PartNo", "M"}});
        addLine(row, "PAINT", u"Paint "_s + place,
                {{"SEQ_NO", 3}, {"pthour", hours}, {"rr_rate2", 48}, {"blend", i % 2}});
        addLine(row, "OPG", u"Protect "_s + place, {{"pthour", 0.25 * i}, {"opg_rate", 12.5}});
        addLine(row, "PRT", u"New "_s + place,
                {{"SEQ_NO", 100 - i},
                 {"qty", i + 1},
                 {"unitcost", 19.95 * (i + 1)},
                 {"rrhour", 26.6 * (i + 1)},
                 {"PartNo", u"P-%1"_s.arg(i)}});
        addLine(row, "MIS", u"Materials for "_s + place, {{"unitcost", 3.333 * (i + 1)}});
    }
    addLine(row, "MIS", "Towing", {{"unitcost", 150}, {"VENDOR", tower}, {"PartNo", "towi"}});
    addLine(row, "MIS", "Storage", {{"unitcost", 75}, {"VENDOR", tower}, {"PartNo", "ENVL"}});
    addLine(row, "R&R", "Rust under the sill", {{"Report_on", 1}, {"rrhour", 4}, {"rr_rate2", 40}});
    addLine(row, "MIS", "Tyres worn", {{"Report_on", 1}, {"VENDOR", tower}});
    addLine(row, "PRT", "Badge", {{"SEQ_NO", 32767}, {"qty", 1}, {"unitcost", 7}, {"rrhour", 7}});

    EXPECT_DOUBLE_EQ(send("A-40"), 3843.5);
    expectDocument(u"A-40.0_1.xml"_s, u"forty-lines.xml"_s);
}

}  // namespace kest::test

#include "Sending.h"
#include "outbound/ExtraInfo.h"
#include "outbound/frmExtraInfo.h"
#include "platform/desktop/Prompt.h"
#include "platform/values.h"
#include "shell/SharedVariables.h"

namespace kest::test {

using namespace Qt::StringLiterals;

class ExtraInformation : public Sending {
protected:
    /// The dialog is shown for the quote 500 and worked with these steps, JSON with single quotes for double ones.
    ExtraValues show(const char* steps)
    {
        quote("500");
        const QByteArray json = QByteArray("{\"windows\": {\"frmExtraInfo\": [[") + steps + "]]}}";
        desktop.emplace(QByteArray(json).replace('\'', '"').constData());
        const ExtraInfoResult result = frmExtraInfo::ShowForm(u"500"_s, u"0"_s);
        return std::holds_alternative<ExtraValues>(result) ? std::get<ExtraValues>(result) : ExtraValues{};
    }
};

// Fills every field with what passes the checks; the damage description last.
#define COMPLETE                                                                   \
    "{'set': 'txtVIN', 'text': 'V1'}, {'set': 'txtCylinders', 'text': '6 cyl'},"   \
    "{'set': 'txtColour', 'text': 'Red'}, {'set': 'txtBuildMonth', 'text': '12'}," \
    "{'set': 'txtBuildYear', 'text': '2024'}, {'set': 'txtDamageDesc', 'text': 'dent'}"
#define DONE "{'click': 'Command1'}"

TEST_F(ExtraInformation, EachFieldIsCheckedBeforeItIsLeft)
{
    const std::pair<const char*, const char*> cases[] = {
        {"{'set': 'txtDamageDesc', 'text': ''}", "Damage Description must be entered."},
        {"{'set': 'txtBuildMonth', 'text': ''}", "Build Date must be entered."},
        {"{'set': 'txtBuildMonth', 'text': '00'}", "Invalid Build Month, Please try again."},
        {"{'set': 'txtBuildMonth', 'text': '13'}", "Invalid Build Month, Please try again."},
        {"{'set': 'txtBuildMonth', 'text': 'May'}", "Invalid Build Month, Please try again."},
        {"{'set': 'txtBuildYear', 'text': ''}", "Build Date must be entered."},
        {"{'set': 'txtBuildYear', 'text': '1900'}", "Invalid Build Year, Please try again."},
        {"{'set': 'txtBuildYear', 'text': '2100'}", "Invalid Build Year, Please try again."},
        {"{'set': 'txtVIN', 'text': ''}", "VIN Number must be entered."},
        {"{'set': 'txtCylinders', 'text': ''}", "Number of Cylinders must be entered."},
        {"{'set': 'txtColour', 'text': ''}", "Colour must be entered."}};
    for (const auto& [step, message] : cases) {
        show((QByteArray(COMPLETE ",") + step + "," DONE "," COMPLETE "," DONE).constData());
        EXPECT_EQ(desktop->boxes(), QStringList(u"none||%1|ok"_s.arg(QLatin1StringView(message)))) << step;
    }
    car("ABC123").set("COLOUR", "Mauve");
    show(
        "{'set': 'txtDamageDesc', 'text': 'dent'}, {'set': 'txtVIN', 'text': 'V1'},"
        "{'set': 'txtCylinders', 'text': '4'}," DONE "," COMPLETE "," DONE);
    EXPECT_EQ(desktop->boxTexts(), QStringList(u"You must select a valid KEST Colour"_s));
}

TEST_F(ExtraInformation, DoneIsTheOnlyWayOut)
{
    EXPECT_THROW(show(COMPLETE), desktop::NeedsAnswer) << "the close box";
    EXPECT_THROW(show(COMPLETE ", {'key': 'txtVIN', 'keys': ['Escape']}, {'read': 'txtVIN'}"), desktop::NeedsAnswer);
    EXPECT_EQ(desktop->read(u"txtVIN"_s), u"V1"_s);
    EXPECT_EQ(car("ABC123").text("VIN"), "") << "nothing is stored without it";
}

TEST_F(ExtraInformation, EnterGoesFromFieldToField)
{
    show(
        "{'key': 'cmbTransmission', 'keys': ['Return']}, {'key': 'frmExtraInfo', 'keys': ['1', 'Return', '2', "
        "'Return']},"
        "{'key': 'frmExtraInfo', 'keys': ['r', 'Return', '4', 'Return', '5', 'x', '0', 'Return', '7', 'Return']},"
        "{'key': 'frmExtraInfo', 'keys': ['7', '7', 'Return', 'd']}," DONE);
    EXPECT_EQ(desktop->boxTexts(), QStringList());
    const std::pair<const char*, const char*> expected[] = {
        {"VIN", "1"}, {"COLOUR", "Red"}, {"CYLINDERS", "4"}, {"Year", "7/1977"}};
    for (const auto& [column, text] : expected)
        EXPECT_EQ(car("ABC123").text(column), text) << column;
    EXPECT_EQ(quote("500").text("kms"), "2");
}

TEST_F(ExtraInformation, AYearOfTwoDigitsIsWidenedWhenItIsLeft)
{
    const std::pair<const char*, const char*> cases[] = {
        {"29", "2029"}, {"30", "1930"}, {"05", "2005"}, {"198", "198"}, {"xx", "xx"}};
    for (const auto& [typed, expected] : cases) {
        show((QByteArray("{'set': 'txtBuildYear', 'text': '") + typed +
              "'}, {'key': 'txtBuildYear', 'keys': ['Tab']}, {'read': 'txtBuildYear'}," COMPLETE "," DONE)
                 .constData());
        EXPECT_EQ(desktop->read(u"txtBuildYear"_s), QLatin1StringView(expected));
    }
}

TEST_F(ExtraInformation, ColoursCompleteThemselves)
{
    const struct {
        const char* steps;
        const char* colour;
    } cases[] = {
        {"{'set': 'txtColour', 'text': 'b'}", "Beige"},
        {"{'set': 'txtColour', 'text': 'blx'}",
         "Black"},  // no colour goes on with x: back to "Bl", and black is its first
        {"{'set': 'txtColour', 'text': 'x'}", ""},
        {"{'set': 'txtColour', 'text': 'blu'}, {'key': 'txtColour', 'keys': ['Backspace']}", "Black"},
        {"{'set': 'txtColour', 'text': 'g'}, {'key': 'txtColour', 'keys': ['r', 'e', 'y', 'Return']}", "Grey"},
        {"{'set': 'txtColour', 'text': 'pu'}, {'click': 'cmdColour'}, {'key': 'txtColour', 'keys': ['Tab']}", "Purple"},
        {"{'set': 'txtColour', 'text': 'm'}, {'click': 'cmdColour'}, {'key': 'txtColour', 'keys': ['Down']}", "Maroon"},
        {"{'set': 'txtColour', 'text': 'm'}, {'click': 'cmdColour'}, {'key': 'lvColour', 'keys': ['Down']}", "Orange"},
        {"{'set': 'txtColour', 'text': 'm'}, {'click': 'cmdColour'}, {'select': 'lvColour', 'item': 'Pink'}", "Pink"},
        {"{'set': 'txtColour', 'text': 'w'}, {'click': 'cmdColour'}, {'click': 'txtVIN'}", "White"}};
    for (const auto& c : cases) {
        show((QByteArray(c.steps) + ", {'read': ['txtColour', 'lvColour']}," COMPLETE "," DONE).constData());
        EXPECT_EQ(desktop->read(u"txtColour"_s), QLatin1StringView(c.colour)) << c.steps;
        EXPECT_EQ(desktop->read(u"lvColour"_s, u"visible"_s), false) << c.steps;
    }
}

TEST_F(ExtraInformation, AMissingRecordIsSaidAndNothingIsShownOrStored)
{
    const std::pair<const char*, const char*> cases[] = {
        {"DELETE FROM QUOTE1", "Couldn't locate quote in database, Please contact MarlinDesk Support"},
        {"DELETE FROM CAR", "Missing relationship : Car, Please contact MarlinDesk Support"},
        {"UPDATE CAR SET MODEL_ID='none'",
         "Missing relationship : Model or Customer, Please contact MarlinDesk Support"},
        {"UPDATE CAR SET CUST_ID=NULL", "Missing relationship : Model or Customer, Please contact MarlinDesk Support"}};
    for (const auto& [statement, message] : cases) {
        quote("500");
        gConn->execute(QString::fromLatin1(statement));
        for (const ExtraInfoResult& result :
             {frmExtraInfo::ShowForm(u"500"_s, u"0"_s), BuildArrayFromDB(u"500"_s, u"0"_s)})
            EXPECT_EQ(std::get<QString>(result), QLatin1StringView(message));
        for (const char* table : {"QUOTE1", "QUOTE3", "CAR"})
            gConn->execute(u"DELETE FROM "_s + QLatin1StringView(table));
    }
    sendable().set("ExtraInfo", true);
    customer("Holloway");
    gConn->execute(u"INSERT INTO ALLMODEL (MODEL_ID, MAKE) VALUES ('C120', 'TWICE')"_s);
    EXPECT_EQ(send("500"), 0);
    EXPECT_EQ(shown(), "[critical] Missing relationship : Model or Customer, Please contact MarlinDesk Support");
}

TEST_F(ExtraInformation, TheCarTakesItsNormalFormsOnEverySend)
{
    const struct {
        Value year, transmission, colour;
        const char *month, *yearOfManufacture, *storedYear, *storedTransmission, *color;
    } cases[] = {{"03/1998", "AUTOMATIC ", "Aqua ", "03", "1998", "03/1998", "Automatic", "AQUA"},
                 {"1998", " a", "Sea Mist", "01", "1998", "01/1998", "Automatic", "sea mist"},
                 {"98", "M", nullptr, "(none)", "(none)", "/", "Manual", "(none)"},
                 {nullptr, nullptr, "GREY", "(none)", "(none)", "/", "Manual", "GREY"},
                 {"2/2001", "auto", "", "2", "2001", "2/2001", "Manual", "(none)"},
                 {"March 1998", "", "", "01", "March 1998", "01/March 1998", "Manual", "(none)"}};
    for (const auto& c : cases) {
        sendable().locked(false);
        car("ABC123").set("Year", c.year).set("XMission", c.transmission).set("COLOUR", c.colour);
        ASSERT_NE(send("500"), 0);
        EXPECT_EQ(car("ABC123").text("Year"), c.storedYear);
        EXPECT_EQ(car("ABC123").text("XMission"), c.storedTransmission);
        EXPECT_EQ(sent(u"quoteExtraVehicleInformation/monthOfManufacture"_s), c.month) << c.storedYear;
        EXPECT_EQ(sent(u"quoteExtraVehicleInformation/yearOfManufacture"_s), c.yearOfManufacture) << c.storedYear;
        EXPECT_EQ(sent(u"quoteExtraVehicleInformation/color"_s), c.color);
    }
}

TEST_F(ExtraInformation, WithoutTheExtraRecordsTheCarsOwnTextsAreSent)
{
    gConn->execute(u"INSERT INTO ALLMODEL (MODEL_ID, MAKE) VALUES ('C120', 'TWICE')"_s);
    const struct {
        const char *year, *month, *yearOfManufacture;
    } cases[] = {{"03/1998", "03", "1998"}, {"1998", "(none)", "1998"}, {"3/1998", "(none)", "(none)"}};
    for (const auto& c : cases) {
        sendable().locked(false);
        car("ABC123").set("Year", c.year);
        ASSERT_NE(send("500"), 0);
        EXPECT_EQ(sent(u"quoteExtraVehicleInformation/monthOfManufacture"_s), c.month) << c.year;
        EXPECT_EQ(sent(u"quoteExtraVehicleInformation/yearOfManufacture"_s), c.yearOfManufacture) << c.year;
    }
}

TEST_F(ExtraInformation, ThePersonOfACustomerIsToldByTitleAndFirstName)
{
    const struct {
        Value title, first;
        const char *companyName, *titleText, *firstName, *surname;
    } cases[] = {{"", "", "Holloway", "(none)", "(none)", "(none)"}, {nullptr, nullptr, "(none)", "", "", "Holloway"},
                 {nullptr, "", "(none)", "", "", "Holloway"},        {"Mr", "", "(none)", "Mr", ".", "Holloway"},
                 {"Mr", nullptr, "(none)", "Mr", ".", "Holloway"},   {"", "Kim ", "(none)", "", "Kim", "Holloway"}};
    for (const auto& c : cases) {
        sendable().locked(false);
        customer("Holloway").set("SALUTATION", c.title).set("FIRSTNAME", c.first);
        ASSERT_NE(send("500"), 0);
        const std::pair<const char*, const char*> expected[] = {
            {"companyName", c.companyName}, {"title", c.titleText}, {"firstName", c.firstName}, {"surname", c.surname}};
        for (const auto& [element, text] : expected)
            EXPECT_EQ(sent(u"quoteClaimCustomer/"_s + QLatin1StringView(element)), text) << element;
    }
}

}  // namespace kest::test

// Tests the window for the extra vehicle values, and their forms in the document.
#include "Sending.h"
#include "outbound/ExtraInfo.h"
#include "outbound/frmExtraInfo.h"
#include "platform/Prompt.h"

struct ExtraInformation : Sending {
    /// Shows the dialog for the quote 500 and does these steps, which are JSON with single instead of double quotes.
    void show(const QString& steps)
    {
        quote("500");
        desktop.emplace(u"{'windows': {'frmExtraInfo': [[%1]]}}"_s.arg(steps).replace(u'\'', u'"').toUtf8());
        frmExtraInfo::ShowForm(u"500"_s, u"0"_s);
    }
};

QString typed(const QString& field, const QString& text)
{
    return u"{'set': '%1', 'text': '%2'}, "_s.arg(field, text);
}

// Fills all fields with valid values, the damage description last.
const QString complete = typed(u"txtVIN"_s, u"V1"_s) + typed(u"txtCylinders"_s, u"6 cyl"_s) +
                         typed(u"txtColour"_s, u"Red"_s) + typed(u"txtBuildMonth"_s, u"12"_s) +
                         typed(u"txtBuildYear"_s, u"2024"_s) + typed(u"txtDamageDesc"_s, u"dent"_s);
const QString done = u"{'click': 'Command1'}"_s;
const QString completeAndDone = complete + done;

TEST_F(ExtraInformation, EachFieldIsCheckedBeforeItIsLeft)
{
    for (const auto& [field, text, message] : casesIn<3>("outbound/extra-checks.txt")) {
        show(complete + typed(field, text) + done + u", "_s + completeAndDone);
        EXPECT_EQ(desktop->boxes(), QStringList(u"none||%1|ok"_s.arg(message))) << field;
    }
    car("ABC123").set("COLOUR", "Mauve");
    show(typed(u"txtDamageDesc"_s, u"dent"_s) + typed(u"txtVIN"_s, u"V1"_s) + typed(u"txtCylinders"_s, u"4"_s) + done +
         u", "_s + completeAndDone);
    EXPECT_EQ(desktop->boxTexts(), QStringList(u"You must select a valid KEST Colour"_s));
}

TEST_F(ExtraInformation, DoneIsTheOnlyWayOut)
{
    EXPECT_THROW(show(complete + u"{'read': true}"_s), desktop::NeedsAnswer) << "the close box";
    EXPECT_EQ(car("ABC123").text("VIN"), "") << "nothing is stored without it";
}

TEST_F(ExtraInformation, EnterGoesFromFieldToField)
{
    show(
        u"{'key': 'cmbTransmission', 'keys': ['Return']}, {'key': 'frmExtraInfo', 'keys': ['1', 'Return', '2', "
        "'Return', 'r', 'Return', '4', 'Return', '5', 'x', '0', 'Return', '7', 'Return', '7', '7', 'Return', 'd']}, "_s +
        done);
    EXPECT_EQ(desktop->boxTexts(), QStringList());
    EXPECT_TRUE(car("ABC123").shows("VIN=1 COLOUR=Red CYLINDERS=4 Year=7/1977"));
    EXPECT_TRUE(quote("500").shows("kms=2"));
}

TEST_F(ExtraInformation, AYearOfTwoDigitsIsWidenedWhenItIsLeft)
{
    for (const auto& [year, expected] :
         {std::pair(u"29"_s, u"2029"_s), {u"30"_s, u"1930"_s}, {u"198"_s, u"198"_s}, {u"xx"_s, u"xx"_s}}) {
        show(typed(u"txtBuildYear"_s, year) +
             u"{'key': 'txtBuildYear', 'keys': ['Tab']}, {'read': 'txtBuildYear'}, "_s + completeAndDone);
        EXPECT_EQ(desktop->read(u"txtBuildYear"_s), expected);
        if (expected.size() == 4) {
            show(complete + typed(u"txtBuildYear"_s, year) + u"{'key': 'txtBuildYear', 'keys': ['Alt+N']}"_s);
            EXPECT_EQ(desktop->boxTexts(), QStringList()) << "the key of \"Done\" leaves the focus in the field";
        }
    }
}

TEST_F(ExtraInformation, ColoursCompleteThemselves)
{
    for (const auto& [steps, colour] : casesIn<2>("outbound/colours.txt")) {
        show(steps + u", {'read': ['txtColour', 'lvColour']}, "_s + completeAndDone);
        EXPECT_EQ(desktop->read(u"txtColour"_s), colour) << steps;
        EXPECT_EQ(desktop->read(u"lvColour"_s, u"visible"_s), false) << steps;
    }
}

TEST_F(ExtraInformation, NoTextIsLongerThanItsColumn)
{
    const QString digits = u"1"_s.repeated(300);
    const auto longest = [&](const QString& field) {
        show(typed(field, digits) + u"{'read': '%1'}, "_s.arg(field) + completeAndDone);
        return desktop->read(field).toString().size();
    };
    EXPECT_EQ(longest(u"txtVIN"_s), opened(u"SELECT * FROM CAR"_s).size(u"VIN"_s));
    EXPECT_EQ(longest(u"txtOdometer"_s), opened(u"SELECT * FROM QUOTE1"_s).size(u"kms"_s));
    const int both = opened(u"SELECT * FROM CAR"_s).size(u"Year"_s);
    EXPECT_EQ(longest(u"txtBuildMonth"_s) + u"/2024"_s.size(), both);
    EXPECT_EQ(longest(u"txtBuildYear"_s) + u"12/"_s.size(), both);
}

TEST_F(ExtraInformation, AMissingRecordStopsIt)
{
    for (const auto& [statement, message] : casesIn<2>("outbound/missing-records.txt")) {
        quote("500");
        gConn->execute(statement);
        for (const ExtraInfoResult& result :
             {frmExtraInfo::ShowForm(u"500"_s, u"0"_s), BuildArrayFromDB(u"500"_s, u"0"_s)})
            EXPECT_EQ(std::get<QString>(result), message);
        for (const char* table : {"QUOTE1", "QUOTE3", "CAR"})
            gConn->execute(u"DELETE FROM "_s + QLatin1StringView(table));
    }
}

TEST_F(ExtraInformation, TheCarTakesItsNormalFormsOnEverySend)
{
    for (const char* table : {"MODEL", "ALLMODEL", "ALLMODEL"})
        gConn->execute(u"INSERT INTO %1 (MODEL_ID, MAKE) VALUES ('TWICE', 'X')"_s.arg(QLatin1StringView(table)));
    for (const auto& [before, after, document] : casesIn<3>("outbound/car-forms.txt")) {
        gConn->execute(u"DELETE FROM CAR"_s);
        sendable().locked(false);
        fill(car("ABC123"), before);
        ASSERT_NE(send("500"), 0);
        EXPECT_EQ(car("ABC123").text("Year") + ' ' + car("ABC123").text("XMission"), after.toStdString());
        const QString extra = u"quoteExtraVehicleInformation/"_s;
        EXPECT_EQ(sent(extra + u"monthOfManufacture"_s) + ' ' + sent(extra + u"yearOfManufacture"_s) + ' ' +
                      sent(extra + u"color"_s),
                  document.toStdString())
            << before;
    }
}

TEST_F(ExtraInformation, APersonIsToldByTitleOrFirstName)
{
    for (const auto& [columns, expected] : casesIn<2>("outbound/customers.txt")) {
        sendable().locked(false);
        fill(customer("Holloway"), columns);
        ASSERT_NE(send("500"), 0);
        QStringList told;
        for (const char* element : {"companyName", "title", "firstName", "surname"})
            told << QString::fromStdString(sent(u"quoteClaimCustomer/"_s + QLatin1StringView(element)));
        EXPECT_EQ(told.join(u", "_s), expected) << columns;
    }
}

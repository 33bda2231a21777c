// The password question: what is let in, what is said, and how the field tells that it has the focus.
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"
#include "utilities/frmLogin.h"

#include <QLineEdit>
#include <QPushButton>

namespace kest {

using namespace Qt::StringLiterals;
using test::ScriptedDesktop;
using test::TestProfile;

namespace {

bool login(const std::string& steps, QStringList& boxes)
{
    ScriptedDesktop desk(("{\"windows\": {\"frmLogin\": [[" + steps + "]]}}").c_str());
    bool ok = true;
    frmLogin::ShowForm(ok);
    boxes = desk.boxes();
    return ok;
}

}  // namespace

TEST(Login, ThePasswordIsANumberThatChangesEachDay)
{
    EXPECT_EQ(DayPassword(QDate(1899, 12, 30)), 4711);
    EXPECT_EQ(DayPassword(QDate(2026, 11, 22)), 46348 + 4711);
}

TEST(Login, OnlyTheDaysNumberPassesAndOnlyAWrongNumberIsRemarkedOn)
{
    const TestProfile profile;
    const std::string password = std::to_string(DayPassword(QDate::currentDate()));
    struct {
        std::string typed;
        bool passes;
        bool remarked;
    } const cases[] = {
        {password, true, false},
        {"000" + password, true, false},
        {password + ".0", true, false},
        {password + "1", false, true},
        {"0", false, true},
        {"secret", false, false},
        {password + "x", false, false},
    };
    for (const auto& [typed, passes, remarked] : cases) {
        QStringList boxes;
        EXPECT_EQ(login("{\"set\": \"txtPassword\", \"text\": \"" + typed + "\"}, {\"click\": \"cmdOK\"}", boxes),
                  passes)
            << typed;
        EXPECT_EQ(boxes, remarked ? QStringList(u"exclamation|Login|Invalid Password, try again!|ok"_s) : QStringList())
            << typed;
    }
}

TEST(Login, AnotherTryAndEnterAreTakenAndCancelIsNot)
{
    const TestProfile profile;
    const QString password = QString::number(DayPassword(QDate::currentDate()));
    QString keys;  // the wrong text is marked, so that typing replaces it
    for (const QChar digit : password)
        keys += u"\"%1\", "_s.arg(digit);
    QStringList boxes;
    EXPECT_TRUE(login(R"({"set": "txtPassword", "text": "1"}, {"click": "cmdOK"}, {"key": "txtPassword", "keys": [)" +
                          keys.toStdString() + R"("Return"]})",
                      boxes));
    EXPECT_EQ(boxes.size(), 1);
    const std::string typed = R"({"set": "txtPassword", "text": ")" + password.toStdString() + R"("}, )";
    EXPECT_FALSE(login(typed + R"({"click": "cmdCancel"})", boxes));
    EXPECT_FALSE(login(typed + R"({"key": "frmLogin", "keys": "Escape"})", boxes));
}

TEST(Login, OkIsEnabledByTheFirstTextAndNeverDisabledAgain)
{
    const TestProfile profile;
    ScriptedDesktop desk(R"({"windows": {"frmLogin": [[ {"read": "cmdOK"},
        {"set": "txtPassword", "text": "1"}, {"set": "txtPassword", "text": ""}, {"click": "cmdOK"}, {"read": "cmdOK"} ]]}})");
    bool ok = true;
    frmLogin::ShowForm(ok);
    EXPECT_FALSE(ok);
    EXPECT_EQ(desk.boxTexts(), QStringList());
    const QJsonArray& reads = desk.record().reads;
    ASSERT_EQ(reads.size(), 2);
    EXPECT_FALSE(reads[0][u"values"_s][u"cmdOK"_s][u"enabled"_s].toBool(true));
    EXPECT_TRUE(reads[1][u"values"_s][u"cmdOK"_s][u"enabled"_s].toBool(false));
}

TEST(Login, TheFieldIsYellowWithTheFocusAndCyanWithout)
{
    const TestProfile profile;
    QColor withFocus, without;
    const test::Hands hands({{u"frmLogin"_s, [&](QDialog& window) {
                                  const auto& password = test::control<QLineEdit>(window, "txtPassword");
                                  withFocus = password.palette().color(QPalette::Base);
                                  test::control<QPushButton>(window, "cmdCancel").setFocus();
                                  without = password.palette().color(QPalette::Base);
                              }}});
    bool ok = true;
    frmLogin::ShowForm(ok);
    EXPECT_EQ(withFocus, QColor(Qt::yellow));
    EXPECT_EQ(without, QColor(Qt::cyan));
}

}  // namespace kest

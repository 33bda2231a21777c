// The password question: what is let in, what is said, and how its controls tell where one stands.
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"
#include "utilities/frmLogin.h"

#include <QLineEdit>
#include <QPushButton>

namespace kest {

using namespace Qt::StringLiterals;
using test::control;

TEST(Login, OnlyTheDaysNumberPassesAndOnlyAWrongNumberIsRemarkedOn)
{
    EXPECT_EQ(DayPassword(QDate(2026, 11, 22)), 46348 + 4711);
    const test::TestProfile profile;
    const std::string password = std::to_string(DayPassword(QDate::currentDate()));
    const std::string ok = R"({"click": "cmdOK"})";
    struct {
        std::string typed, answer;
        bool passes, remarked;
    } const cases[] = {
        {"000" + password, ok, true, false},
        {password, R"({"key": "txtPassword", "keys": "Return"})", true, false},
        {"0", ok + R"(, {"set": "txtPassword", "text": ")" + password + "\"}, " + ok, true, true},
        {password + "1", ok, false, true},
        {password + "x", ok, false, false},
        {password, R"({"click": "cmdCancel"})", false, false},
        {password, R"({"key": "frmLogin", "keys": "Escape"})", false, false},
    };
    for (const auto& [typed, answer, passes, remarked] : cases) {
        const std::string type = R"({"set": "txtPassword", "text": ")" + typed + "\"}, ";
        const test::ScriptedDesktop desk((R"({"windows": {"frmLogin": [[)" + type + answer + "]]}}").c_str());
        bool passed = !passes;
        frmLogin::ShowForm(passed);
        EXPECT_EQ(passed, passes) << typed << answer;
        EXPECT_EQ(desk.boxes().join(u'\n'),
                  remarked ? u"exclamation|Login|Invalid Password, try again!|ok"_s : QString())
            << typed << answer;
    }
}

TEST(Login, TheControlsTellWhereOneStands)
{
    const test::TestProfile profile;
    const test::ScriptedDesktop desk;
    const test::Hands hands({{u"frmLogin"_s, [](QDialog& window) {
                                  auto& password = control<QLineEdit>(window, "txtPassword");
                                  auto& ok = control<QPushButton>(window, "cmdOK");
                                  EXPECT_EQ(password.palette().color(QPalette::Base), QColor(Qt::yellow));
                                  EXPECT_FALSE(ok.isEnabled());
                                  password.setText(u"1"_s);
                                  password.clear();
                                  EXPECT_TRUE(ok.isEnabled()) << "it is never disabled again";
                                  ok.setFocus();
                                  EXPECT_EQ(password.palette().color(QPalette::Base), QColor(Qt::cyan));
                                  password.setText(u"1"_s);
                                  ok.click();
                                  EXPECT_TRUE(password.hasFocus());
                                  EXPECT_EQ(password.selectedText(), u"1"_s);
                              }}});
    bool passed = false;
    frmLogin::ShowForm(passed);
}

}  // namespace kest

// Tests the password dialog: what it accepts, what it says, and the colours of its field.
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"
#include "utilities/frmLogin.h"

TEST(Login, OnlyTheDaysNumberPasses)
{
    EXPECT_EQ(dayPassword(QDate(2026, 11, 22)), 46348 + 4711);
    const test::TestProfile profile;
    const QString password = QString::number(dayPassword(QDate::currentDate()));
    for (const auto& [typed, answer, passes, box] : test::casesIn<4>("login.txt")) {
        const QString steps = uR"({"set": "txtPassword", "text": "%1"}, %2)"_s.arg(typed, answer);
        const QString script = uR"({"windows": {"frmLogin": [[%1]]}})"_s.arg(steps).replace(u"TODAY"_s, password);
        const test::ScriptedDesktop desk(script.toUtf8());
        bool passed = passes.isEmpty();
        frmLogin::ShowForm(passed);
        EXPECT_EQ(passed, !passes.isEmpty()) << script;
        EXPECT_EQ(desk.boxes().join(u'\n'), box) << script;
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

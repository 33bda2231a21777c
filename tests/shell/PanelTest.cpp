#include "platform/database/FaultInjection.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "shell/SharedVariables.h"
#include "shell/eKEST.h"
#include "support/Shop.h"
#include "utilities/frmLogin.h"

#include <gtest/gtest.h>

namespace kest {
namespace {

using namespace Qt::StringLiterals;

class Panel : public test::Shop {
protected:
    /// Shows the panel on a quote, driven by steps.
    void show(const char* quote, const char* steps)
    {
        desktop.emplace((std::string(R"json({"windows": {"frmKEST": [)json") + steps + "]}}").c_str());
        eKEST().ShowKESTWindow(QString::fromLatin1(quote), u"0"_s);
    }
};

TEST_F(Panel, UtilitiesWithoutAQuoteAsksForNoPassword)
{
    show("0", R"json([{"click": "Option1(3)"}, {"click": "cmdOK"}])json");
    EXPECT_EQ(desktop->boxes(), QStringList(u"information||No quote is open.|ok"_s));
}

TEST_F(Panel, EnterWithoutShiftKeysIsOk)
{
    show("0", R"json([{"click": "Option1(3)"}, {"key": "Option1(3)", "keys": "Shift+Return"}])json");
    EXPECT_EQ(desktop->boxes().size(), 0);
    show("0", R"json([{"click": "Option1(3)"}, {"key": "Option1(3)", "keys": "Return"}])json");
    EXPECT_EQ(desktop->boxes().size(), 1);
}

TEST_F(Panel, AMissingTransportProgramIsSilent)
{
    show("0", R"json([{"click": "Option1(0)"}, {"click": "cmdOK"}, {"read": ["cmdOK"]}, {"click": "cmdExit"}])json");
    EXPECT_EQ(desktop->boxes().size(), 0);
    EXPECT_TRUE(desktop->read(u"cmdOK"_s, u"enabled"_s).toBool());
}

TEST_F(Panel, AConnectionThatWasLostIsOpenedAgainByTheNextClick)
{
    test::quote("500");
    int statements = 0;
    db::setStatementFault([&] { return ++statements == 2; }, CannotOpen);  // the first one opens the panel's quote
    const std::string password = std::to_string(DayPassword(QDate::currentDate()));
    show("500", (R"json([{"click": "Option1(2)"}, {"click": "cmdOK"},
                         {"click": "Option1(3)"}, {"click": "cmdOK"},
                         {"click": "Option1(2)"}, {"click": "cmdOK"}]],
                 "frmUtilities": [[{"click": "Command2"}]],
                 "frmLogin": [[{"set": "txtPassword", "text": ")json" +
                 password + R"json("}, {"click": "cmdOK"}])json")
                    .c_str());
    db::setStatementFault({});
    const QStringList texts = desktop->boxTexts();
    ASSERT_EQ(texts.size(), 2) << texts.join(u'\n').toStdString();
    EXPECT_TRUE(texts[0].contains(u"-2147467259"_s)) << texts[0].toStdString();
    EXPECT_TRUE(texts[1].contains(u"$0 variations"_s)) << texts[1].toStdString();
}

TEST_F(Panel, WithoutAConnectionItIsNotShown)
{
    gConn->close();
    files::remove(profile::root() + u"/databases/WirSql.db"_s);
    show("500", R"json([{"read": ["cmdOK"]}])json");
    EXPECT_EQ(desktop->boxTexts(),
              QStringList(u"Could not connect to the quote database, Please contact MarlinDesk Support."_s));
    EXPECT_TRUE(desktop->record().reads.isEmpty());
}

}  // namespace
}  // namespace kest

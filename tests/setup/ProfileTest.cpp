// Tests new profiles: their folders, settings and tables, and the demo shop.
#include "setup/PrepareDatabase.h"
#include "setup/Profile.h"
#include "setup/QuoteDatabase.h"
#include "shell/component.h"
#include "support/OdbcDrivers.h"
#include "support/Shop.h"

#include <QSqlDatabase>
#include <QSqlQuery>

#include <ranges>

const QDate today(2008, 3, 21);

/// Returns the first column of all rows, separated by blanks.
static std::string column(const QString& select)
{
    QStringList texts;
    db::Recordset rows(app::openEmbedded(u"WirSql"_s));
    for (rows.open(select); !rows.eof(); rows.moveNext())
        texts << rows.text(rows.columns().first());
    return texts.join(u' ').toStdString();
}

struct Profile : ::testing::Test {
    TestProfile profile;
};

struct NewShop : Profile {
    NewShop()
    {
        app::initProfile(registerClass, app::Shop::New);
        database = app::openEmbedded(u"WirSql"_s);
    }
    /// Executes the statements of a table, and checks what its queries find.
    void holds(const std::string& table) const
    {
        for (const auto& [statement, expected] : casesIn<2>(table)) {
            const auto answer = [&, &text = statement] {
                if (text.startsWith(u"SELECT"_s))
                    return QString::fromStdString(column(text));
                database->execute(text);
                return QString();
            };
            EXPECT_EQ(outcomeOf(answer), expected) << statement;
        }
    }

    db::ConnectionPtr database;
};

struct DemoShop : Profile {
    DemoShop()
    {
        app::initProfile(registerClass, app::Shop::Demo, today);
        host.emplace();
    }
    ScriptedDesktop desktop{R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
    std::optional<eKEST> host;
};

TEST_F(Profile, IsMadeWhole)
{
    EXPECT_TRUE(app::initProfile(registerClass, app::Shop::New));

    const QJsonObject where = app::where();
    EXPECT_EQ(where.keys().join(u' '), u"component database images log pdf profile read reports sent unread unsent"_s);
    for (const QString& key : where.keys())
        EXPECT_TRUE(key == u"log"_s || QFileInfo::exists(where[key].toString())) << key;
    EXPECT_EQ(where[u"unread"_s].toString(), profile.driveC() + u"/wirdoc/AUnread"_s);
}

TEST_F(Profile, IsNotTouchedOnceItExists)
{
    EXPECT_TRUE(app::initProfile(registerClass, app::Shop::New, today));
    setSetting(u"ImagesPath"_s, u"d:\\pictures\\"_s);
    const QByteArray registry = files::readBytes(profile.root() + u"/registry.ini"_s);
    EXPECT_FALSE(app::initProfile(registerClass, app::Shop::Demo, today));
    EXPECT_EQ(files::readBytes(profile.root() + u"/registry.ini"_s), registry);
    EXPECT_EQ(files::list(app::where()[u"unread"_s].toString()), QStringList());
    EXPECT_EQ(column(u"SELECT QTNNO FROM QUOTE1"_s), "");
    EXPECT_EQ(app::where()[u"images"_s].toString(), profile.root() + u"/drive_d/pictures"_s);
}

TEST_F(Profile, IsCompletedAfterAnInterruptedStart)
{
    files::makeFolder(profile.root() + u"/databases"_s);
    files::writeBytes(app::embeddedFile(u"unfinished"_s), "half a file");
    // the first start of a host, which copies the settings that it reads
    GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"EcomHome"_s, u"d:\\mail\\"_s);
    EXPECT_TRUE(app::initProfile(registerClass, app::Shop::New));
    EXPECT_NE(column(u"SELECT QUOTE_VAL FROM CINFO"_s), "");
    EXPECT_FALSE(QFileInfo::exists(app::embeddedFile(u"unfinished"_s)));
    EXPECT_EQ(app::where()[u"unread"_s].toString(), profile.root() + u"/drive_d/mail/AUnread"_s);
    EXPECT_TRUE(QFileInfo::exists(app::where()[u"unread"_s].toString()));
    EXPECT_FALSE(app::initProfile(registerClass, app::Shop::New));
}

TEST_F(Profile, IsToldWhereTheComponentLooks)
{
    const QString key = u"Software\\ApplicationSettings\\wirra32\\frmsplash"_s;
    ASSERT_TRUE(settings::createKey(settings::Hive::CurrentUser, key));
    settings::setValue(settings::Hive::CurrentUser, key, u"ReportPath"_s, {settings::Type::Text, u"d:\\rep\\"_s});
    EXPECT_EQ(app::where()[u"reports"_s].toString(), profile.root() + u"/drive_d/rep"_s);
    EXPECT_EQ(app::where()[u"database"_s].toString(), app::embeddedFile(u"WirSql"_s));

    {
        const OdbcDrivers drivers(OdbcDrivers::WithSqlServer);
        EXPECT_EQ(app::where()[u"database"_s].toString(), u"(local)/WirSql"_s);
    }
    EXPECT_FALSE(settings::keyExists(settings::Hive::LocalMachine, u"SOFTWARE"_s)) << "nothing is copied up";
}

TEST_F(NewShop, HoldsWhatTheFirstRequestNeeds)
{
    holds("new-shop.txt");
}

// Other tools ignore the case only of ASCII letters, so they leave other letters in another order.
TEST_F(NewShop, FindsWhatAnotherToolWroteOnceInitHasRebuiltTheIndexes)
{
    {
        QSqlDatabase tool = QSqlDatabase::addDatabase(u"QSQLITE"_s, u"tool"_s);
        tool.setDatabaseName(app::embeddedFile(u"WirSql"_s));
        ASSERT_TRUE(tool.open());
        for (int number = 10; number < 50; ++number)
            tool.exec(u"INSERT INTO CAR (REGO) VALUES ('%1%2')"_s.arg(number % 2 ? u"\u00e9" : u"\u00c9").arg(number));
    }
    QSqlDatabase::removeDatabase(u"tool"_s);
    const auto found = [](int number) {
        return column(u"SELECT COUNT(*) FROM CAR WHERE REGO='\u00e9%1'"_s.arg(number)) == "1";
    };
    const auto numbers = std::views::iota(10, 50);
    ASSERT_FALSE(std::ranges::all_of(numbers, found));
    EXPECT_FALSE(app::initProfile(registerClass, app::Shop::New));
    EXPECT_TRUE(std::ranges::all_of(numbers, found));
}

TEST_F(NewShop, ItsTablesTakeWhatAHostWrites)
{
    holds("host-rows.txt");
}

// A host's own profile, or one from before there were indexes.
TEST_F(NewShop, GetsThePartsThatItLacks)
{
    for (const QString& part : {u"INDEX CUSTOMER_NAME"_s, u"TABLE KESTOperation"_s, u"TABLE KESTJournal"_s})
        database->execute(u"DROP "_s + part);
    EXPECT_FALSE(app::initProfile(registerClass, app::Shop::New));
    EXPECT_TRUE(app::missingParts(app::openEmbedded(u"WirSql"_s)).isEmpty());
}

TEST_F(NewShop, LeavesRowsOfOneKeyInTheOrderInWhichTheyWereAdded)
{
    holds("row-order.txt");
}

TEST_F(DemoShop, HoldsTogether)
{
    for (const QString& rows : linesOf("app/demo-faults.txt"))
        EXPECT_EQ(rowCount(rows.section(u' ', 0, 0), rows.section(u' ', 2)), 0) << rows;
    EXPECT_EQ(rowCount("QUOTE1"), 30);
    const QStringList names = listed();
    EXPECT_EQ(names.size(), 15) << names.join(u' ');
    EXPECT_EQ(desktop.boxTexts(),
              QStringList(u"Message QREQ_20554_1.xml unreadable, Please contact MarlinDesk Support."_s));
    for (const QString& file : names)
        EXPECT_EQ(loadAsTheWindow(file), file != u"MDMSG_1009.xml"_s) << file;
    EXPECT_EQ(listed(), QStringList(u"QREQ_20551_2.xml"_s)) << "it waited behind the first of its request";
}

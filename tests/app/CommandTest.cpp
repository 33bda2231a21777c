#include "app/CommandLine.h"
#include "app/Profile.h"
#include "platform/files/files.h"
#include "support/TestProfile.h"

#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>

#include <gtest/gtest.h>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

struct Ended {
    int exitCode;
    QString errors;
    QJsonObject json;
};

/// The command as a service person runs it, on a demo shop of its own.
class Command : public ::testing::Test {
protected:
    Command() { app::initProfile(true); }

    Ended kest2(const QStringList& words, const QByteArray& script = {}, const QByteArray& input = {}) const
    {
        QStringList arguments{u"--profile"_s, profile.root(), u"--json"_s};
        if (!script.isEmpty()) {
            QFile file(profile.root() + u"/script.json"_s);
            EXPECT_TRUE(file.open(QIODevice::WriteOnly) && file.write(script) == script.size());
            arguments << u"--script"_s << file.fileName();
        }
        QProcess process;
        process.start(QStringLiteral(KEST_COMMAND), arguments + words);
        process.write(input);
        process.closeWriteChannel();
        EXPECT_TRUE(process.waitForFinished());
        EXPECT_EQ(process.exitStatus(), QProcess::NormalExit);
        return {process.exitCode(), QString::fromUtf8(process.readAllStandardError()),
                QJsonDocument::fromJson(process.readAllStandardOutput()).object()};
    }

    TestProfile profile;
};

}  // namespace

TEST(CommandWords, OptionsMayStandOnEitherSideButNotBehindSetting)
{
    const app::CommandLine list = app::parsed({u"--profile"_s, u"p"_s, u"list"_s, u"read"_s, u"--json"_s});
    EXPECT_EQ(list.profile, u"p"_s);
    EXPECT_TRUE(list.json);
    EXPECT_EQ(list.arguments, QStringList(u"read"_s));
    EXPECT_EQ(app::parsed({u"setting"_s, u"set"_s, u"a"_s, u"b"_s, u"c"_s, u"--json"_s}).arguments.size(), 5);
    for (const QStringList& wrong : {QStringList(), {u"--nothing"_s}, {u"--profile"_s}})
        EXPECT_FALSE(app::parsed(wrong).error.isEmpty()) << wrong.join(u' ').toStdString();
}

TEST_F(Command, ExitCodesTellUsageProfileAndConnection)
{
    const std::pair<QStringList, int> cases[] = {
        {{u"dance"_s}, app::Usage},
        {{u"list"_s}, app::Usage},
        {{u"list"_s, u"nowhere"_s}, app::Usage},
        {{u"setting"_s, u"get"_s, u"wirra32"_s}, app::Usage},
        {{u"list"_s, u"unread"_s, u"--profile"_s, profile.root() + u"/none"_s}, app::NoConnection},
        {{u"view"_s, u"unread"_s, u"../../../registry.ini"_s}, app::Refused},
        {{u"view"_s, u"unread"_s, u"absent.xml"_s}, app::Refused},
        {{u"view"_s, u"unread"_s, u"a..xml"_s}, app::Done},
        {{u"load"_s, u"absent.xml"_s}, app::Refused}};
    files::write(u"c:\\wirdoc\\AUnread\\a..xml"_s, u"<a><messageType>NONE</messageType></a>"_s);
    files::write(u"c:\\wirdoc\\ARead\\QRCN.xml"_s, files::read(u"c:\\wirdoc\\AUnread\\QRCN_1012.xml"_s));
    for (const auto& [words, code] : cases)
        EXPECT_EQ(kest2(words).exitCode, code) << words.join(u' ').toStdString();
    const std::pair<QStringList, QString> unsaid[] = {
        // by any box
        {{u"load"_s, u"AUnread/QRCN_1012.xml"_s}, u"AUnread/QRCN_1012.xml is no name of a file of the folder"_s},
        {{u"load"_s, u"a..xml"_s}, u"\"Load\" does nothing with a..xml"_s},
        {{u"reprint"_s, u"QRCN.xml"_s}, u"\"Reprint\" is disabled for QRCN.xml"_s}};
    for (const auto& [words, why] : unsaid) {
        const Ended ended = kest2(words);
        EXPECT_EQ(ended.exitCode, app::Refused);
        EXPECT_TRUE(ended.errors.contains(u"kest2: "_s + why)) << ended.errors.toStdString();
    }

    files::remove(profile.root() + u"/databases/WirSql.db"_s);
    const Ended ended = kest2({u"list"_s, u"unread"_s});
    EXPECT_EQ(ended.exitCode, app::NoConnection);
    EXPECT_EQ(ended.json[u"boxes"][0][u"text"].toString(),
              u"Could not connect to the quote database, Please contact MarlinDesk Support."_s);
}

TEST_F(Command, AListGivesRowsAndTheBoxesThatCameUp)
{
    const Ended ended = kest2({u"list"_s, u"unread"_s});
    EXPECT_EQ(ended.exitCode, app::Done);
    EXPECT_TRUE(ended.json[u"result"].toBool());
    EXPECT_EQ(ended.json[u"rows"][0].toObject().keys(),
              QStringList({u"claim"_s, u"customer"_s, u"file"_s, u"quote"_s, u"rego"_s, u"type"_s, u"vehicle"_s}));
    const QJsonObject box = ended.json[u"boxes"][0].toObject();
    EXPECT_EQ(box[u"icon"], u"critical"_s);
    EXPECT_EQ(box[u"title"], u""_s);
    EXPECT_TRUE(ended.errors.contains(u"[critical] KEST: "_s + box[u"text"].toString()));
}

TEST_F(Command, AFilterAnswersThePromptOrIsTyped)
{
    const Ended typed = kest2({u"list"_s, u"sent"_s, u"--filter"_s, u"1015"_s});
    EXPECT_EQ(typed.json[u"inputs"].toArray().size(), 0);
    EXPECT_EQ(typed.json[u"rows"].toArray().size(), 1);

    const QString sent = app::where()[u"sent"_s].toString();
    for (int i = 0; i < 26; ++i)
        files::write(sent + u"/x%1.xml"_s.arg(i), u"<quoteReference>x</quoteReference>"_s);
    const Ended prompted = kest2({u"list"_s, u"sent"_s, u"--filter"_s, u"1015"_s});
    EXPECT_EQ(prompted.json[u"inputs"][0][u"answer"].toString(), u"1015"_s);
    EXPECT_EQ(prompted.json[u"rows"].toArray().size(), 1);
    EXPECT_EQ(kest2({u"list"_s, u"sent"_s}).json[u"inputs"][0][u"answer"].toString(), u""_s);
}

TEST_F(Command, ALoadedMessageLeavesTheUnreadFolder)
{
    const Ended ended = kest2({u"load"_s, u"QRCN_1012.xml"_s});
    EXPECT_EQ(ended.exitCode, app::Done);
    EXPECT_EQ(ended.json[u"boxes"].toArray().last()[u"text"].toString(), u"Message Loaded"_s);
    EXPECT_FALSE(files::exists(app::where()[u"unread"_s].toString() + u"/QRCN_1012.xml"_s));
}

TEST_F(Command, ASendIsToldByItsBoxAndItsExitCode)
{
    EXPECT_EQ(kest2({u"send"_s, u"1004"_s}).exitCode, app::Done);
    const Ended again = kest2({u"send"_s, u"1004"_s});
    EXPECT_EQ(again.exitCode, app::Refused);
    EXPECT_EQ(again.json[u"boxes"].toArray().size(), 1);
    EXPECT_EQ(kest2({u"send"_s, u"1003"_s}).exitCode, app::NeedsAPerson);
    EXPECT_EQ(kest2({u"send"_s, u"99999"_s}).exitCode, app::Refused);
}

TEST_F(Command, AnOpenPanelIsDrivenByAScript)
{
    const Ended ended = kest2({u"open"_s, u"1004"_s}, R"json({"windows": {
        "frmKEST": [[{"click": "cmdOK"}, {"read": ["Option1(2)"]}, {"click": "cmdExit"}]],
        "frmMessageList": [[{"read": ["ListView1"]}, {"click": "cmdExit"}]]}})json");
    EXPECT_EQ(ended.exitCode, app::Done);
    EXPECT_EQ(ended.json[u"reads"][0][u"window"].toString(), u"frmMessageList"_s);
    EXPECT_TRUE(ended.json[u"reads"][1][u"values"][u"Option1(2)"][u"enabled"].toBool());

    EXPECT_EQ(kest2({u"open"_s}, R"json({"windows": {"frmKEST": [[{"click": "Option1(2)"}]]}})json").exitCode,
              app::NeedsAPerson);
    EXPECT_EQ(kest2({u"open"_s}, "{\"windows\": 5}").exitCode, app::Usage);
}

TEST_F(Command, SettingsAreReadWithoutCopyingAndWritten)
{
    EXPECT_EQ(kest2({u"setting"_s, u"get"_s, u"wirra32"_s, u"frmsplash"_s, u"SAPwd"_s}).json[u"value"].toString(),
              u""_s);
    EXPECT_EQ(kest2({u"setting"_s, u"set"_s, u"new"_s, u"section"_s, u"key"_s, u"--json"_s}).exitCode, app::Done);
    EXPECT_EQ(kest2({u"setting"_s, u"get"_s, u"NEW"_s, u"section"_s, u"KEY"_s}).json[u"value"].toString(), u"--json"_s);
}

TEST_F(Command, TheJobLinkPasswordIsNeverStoredInClear)
{
    const QStringList words{u"joblink"_s, u"set"_s,        u"--server"_s, u"localhost"_s, u"--port"_s,
                            u"3306"_s,    u"--database"_s, u"jobs"_s,     u"--user"_s,    u"shop"_s};
    EXPECT_EQ(kest2(words, {}, "s3cret-pass\n").exitCode, app::Done);
    QFile database(app::where()[u"database"_s].toString());
    ASSERT_TRUE(database.open(QIODevice::ReadOnly));
    EXPECT_FALSE(database.readAll().contains("s3cret"));
    EXPECT_EQ(kest2({u"joblink"_s, u"set"_s}).exitCode, app::Usage);
}

TEST_F(Command, TheTransportCarriesOnceOrUntilItIsToldToEnd)
{
    EXPECT_EQ(kest2({u"transport"_s, u"--twice"_s}).exitCode, app::Usage);
    kest2({u"send"_s, u"1004"_s});
    const QJsonArray carried = kest2({u"transport"_s, u"--once"_s}).json[u"carried"].toArray();
    EXPECT_EQ(carried[0][u"direction"].toString() + u' ' + carried[0][u"file"].toString(), u"out 1004.0_1.xml"_s);
    EXPECT_EQ(carried.last()[u"file"].toString(), u"R_1004_0_620552.xml"_s);

    files::write(app::where()[u"component"_s].toString() + u"/insurer.rules"_s, u"nonsense"_s);
    EXPECT_EQ(kest2({u"transport"_s, u"--once"_s}).exitCode, app::Refused);
}

TEST(DemoProfile, HasAKESTWebThatWorksOnItsOwnProfile)
{
    TestProfile profile;
    const QString place = profile.root() + u"/it's a demo"_s;
    ASSERT_EQ(QProcess::execute(QStringLiteral(KEST_COMMAND), {u"--profile"_s, place, u"init"_s, u"--demo"_s}), 0);

    QProcess web;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.remove(u"KEST2_PROFILE"_s);
    web.setProcessEnvironment(environment);
    web.start(place + u"/component/KESTWeb.exe"_s);
    const QString unread = place + u"/drive_c/wirdoc/AUnread"_s;
    for (int waited = 0; files::list(unread, u"WEB_*"_s).isEmpty() && waited < 20'000; waited += 20)
        web.waitForFinished(20);
    EXPECT_EQ(files::list(unread, u"WEB_*"_s), QStringList(u"WEB_000001_QREQ_20601.xml"_s));
    EXPECT_EQ(QProcess::execute(QStringLiteral(KEST_COMMAND), {u"--profile"_s, place, u"transport"_s, u"--once"_s}),
              app::Refused)
        << "one is enough";
    web.terminate();
    EXPECT_TRUE(web.waitForFinished());
    EXPECT_EQ(web.exitStatus(), QProcess::NormalExit);
    EXPECT_EQ(web.exitCode(), app::Done);
}

}  // namespace kest::test

// Tests the command: its exit codes, its JSON, and what it asks.
#include "app/CommandLine.h"
#include "setup/Profile.h"
#include "setup/QuoteDatabase.h"
#include "shell/component.h"
#include "support/Test.h"

struct Ended {
    int exitCode;
    QString errors;
    QJsonObject json;
};

/// Runs the command as a service person would, in a demo shop. In its words, what follows " < " is typed.
struct Command : ::testing::Test {
    Command() { app::initProfile(registerClass, app::Shop::Demo); }

    Ended kest2(const QString& words, const QByteArray& script = {}) const
    {
        QStringList arguments{u"--profile"_s, profile.root(), u"--json"_s};
        if (!script.isEmpty()) {
            arguments << u"--script"_s << profile.root() + u"/script.json"_s;
            files::writeBytes(arguments.last(), script);
        }
        QProcess process;
        process.start(QStringLiteral(KEST_COMMAND), arguments + words.section(u" < "_s, 0, 0).split(u' '));
        process.write(words.section(u" < "_s, 1).toUtf8() + '\n');
        process.closeWriteChannel();
        EXPECT_TRUE(process.waitForFinished());
        EXPECT_EQ(process.exitStatus(), QProcess::NormalExit);
        return {process.exitCode(), QString::fromUtf8(process.readAllStandardError()),
                QJsonDocument::fromJson(process.readAllStandardOutput()).object()};
    }

    TestProfile profile;
};

TEST_F(Command, TheExitCodeTellsWhatBecameOfIt)
{
    files::write(u"c:\\wirdoc\\AUnread\\a..xml"_s, u"<a><messageType>NONE</messageType></a>"_s);
    setSetting(u"TabletMasterOdbcOptions"_s, u"Port=1;password = s3cret"_s);
    for (const auto& [words, code, line, json] : casesIn<4>("app/commands.txt")) {
        const Ended ended = kest2(words);
        EXPECT_EQ(ended.exitCode, code.toInt()) << words;
        EXPECT_TRUE(ended.errors.contains(line)) << ended.errors;
        const QByteArray printed = QJsonDocument(ended.json).toJson(QJsonDocument::Compact);
        EXPECT_TRUE(printed.contains(json.toUtf8())) << words;
        EXPECT_FALSE(printed.contains("s3cret") || ended.errors.contains(u"s3cret"_s)) << words;
        EXPECT_FALSE(ended.errors.contains(u"propagateSizeHints"_s)) << words;
    }
    EXPECT_TRUE(files::readBytes(profile.root() + u"/registry.ini"_s).contains("SAPwd=text:s3cret\n")) << "as the host";
    EXPECT_FALSE(files::readBytes(app::where()[u"database"_s].toString()).contains("s3cret"));
    files::write(app::where()[u"component"_s].toString() + u"/insurer.rules"_s, u"nonsense"_s);
    EXPECT_EQ(kest2(u"transport --once"_s).exitCode, app::Refused);
    app::openEmbedded(u"WirSql"_s)->execute(u"DROP TABLE SUBLET"_s);
    const Ended incomplete = kest2(u"check-database --prepare"_s);
    EXPECT_EQ(incomplete.exitCode, app::Refused);
    EXPECT_EQ(incomplete.json[u"boxes"].toArray(), QJsonArray()) << "what the host must add is not asked for";
    EXPECT_EQ(incomplete.json[u"points"].toArray().last()[u"why"].toString(), u"there is no table SUBLET"_s);
    files::remove(profile.root() + u"/databases/WirSql.db"_s);
    EXPECT_EQ(kest2(u"list unread"_s).exitCode, app::NoConnection);

    files::write(profile.root() + u"/registry.ini"_s, {});
    for (const QString& words : {u"list unread"_s, u"setting list"_s, u"transport --once"_s, u"init"_s, u"where"_s}) {
        const Ended damaged = kest2(words);
        EXPECT_NE(damaged.exitCode, app::Done) << words;
        EXPECT_TRUE(damaged.errors.contains(u"registry.ini is empty or damaged"_s)) << damaged.errors;
    }
    EXPECT_EQ(files::size(profile.root() + u"/registry.ini"_s), 0);
}

TEST_F(Command, AnInterruptedLoadIsToldOnce)
{
    const auto interrupt = [](int number) {
        app::openEmbedded(u"WirSql"_s)
            ->execute(
                u"INSERT INTO KESTOperation (Operation, OperationKind, State, FileName, QTNNO, LockName, StartedAt) "
                "VALUES (%1, 'load', 'open', 'm.xml', '1007', 'operation x', '2026-11-23T10:31:00')"_s.arg(number));
    };
    interrupt(17);
    const QString told =
        u"The load of m.xml was interrupted on 23/11/2026 at 10:31. It has been taken back; load the message again."_s;
    const Ended first = kest2(u"list unread"_s);
    EXPECT_TRUE(first.errors.contains(told)) << first.errors.toStdString();
    EXPECT_EQ(first.json[u"recovered"][0][u"operation"].toInt(), 17);
    EXPECT_EQ(first.json[u"recovered"][0][u"outcome"].toString(), u"taken back"_s);
    EXPECT_EQ(first.json[u"recovered"][0][u"left"].toArray(), QJsonArray());
    EXPECT_FALSE(QJsonDocument(first.json[u"boxes"].toArray()).toJson().contains("interrupted"));
    EXPECT_FALSE(kest2(u"list unread"_s).json.contains(u"recovered"_s));

    interrupt(90);
    const Ended panel = kest2(u"open 1004"_s, R"json({"windows": {"frmKEST": [[{"click": "none"}]]}})json");
    EXPECT_TRUE(panel.exitCode == app::NeedsAPerson && panel.errors.contains(told)) << panel.errors.toStdString();
    EXPECT_EQ(panel.json[u"recovered"][0][u"operation"].toInt(), 90);
    EXPECT_EQ(panel.json[u"boxes"].toArray(), QJsonArray());
}

TEST_F(Command, ALoadIsUndoneOnlyAfterYes)
{
    kest2(u"load QRCN_1012.xml"_s);
    const int load = kest2(u"history 1012"_s).json[u"operations"][0][u"operation"].toInt();
    const QString undo = u"undo "_s + QString::number(load);
    const Ended refused = kest2(undo);
    EXPECT_EQ(refused.json[u"boxes"][0][u"default"].toString(), u"no"_s);
    EXPECT_EQ(refused.exitCode, app::Refused);
    const Ended undone = kest2(undo, R"({"boxes": [{"text": "Undo the load", "answer": "yes"}]})");
    EXPECT_EQ(undone.exitCode, app::Done) << undone.errors;
    EXPECT_TRUE(files::exists(u"c:\\wirdoc\\AUnread\\QRCN_1012.xml"_s));
}

TEST_F(Command, AFilterAnswersTheQuestionOfALongList)
{
    for (int i = 0; i < 26; ++i)
        files::write(u"c:\\wirdoc\\ASent\\x%1.xml"_s.arg(i), u"<quoteReference>x</quoteReference>"_s);
    for (const auto& [words, rows] : {std::pair(u" --filter 1015"_s, 1), {QString(), 33}}) {
        const QJsonObject json = kest2(u"list sent"_s + words).json;
        EXPECT_EQ(json[u"rows"].toArray().size(), rows);
        EXPECT_EQ(json[u"inputs"][0][u"answer"].toString(), words.section(u' ', 2));
    }
}

TEST_F(Command, ACheckOfTheDatabaseCreatesWhatIsMissingAfterYes)
{
    app::openEmbedded(u"WirSql"_s)->execute(u"DROP INDEX QUOTE1_QTNNO"_s);
    const auto shown = [](const Ended& ended) { return ended.json[u"boxes"][0][u"text"].toString(); };
    const Ended refused = kest2(u"check-database --prepare"_s, R"({"boxes": [{"text": "", "answer": "no"}]})");
    const Ended prepared = kest2(u"check-database --prepare"_s);
    EXPECT_EQ(prepared.exitCode, app::Done) << prepared.errors.toStdString();
    EXPECT_TRUE(shown(prepared).contains(u"CREATE INDEX QUOTE1_QTNNO ON QUOTE1 (QTNNO);"_s));
    EXPECT_EQ(shown(refused), shown(prepared));
}

TEST_F(Command, AScriptChangesNothingThatDialogsRememberForAPerson)
{
    qunsetenv("XDG_CONFIG_HOME");
    qputenv("HOME", profile.root().toLocal8Bit());
    const QByteArray script = R"json({"windows": {"frmPrintPreview": [[{"click": "cmdSave"}]], "SaveDialog": [[
        {"set": "fileNameEdit", "text": "%1/saved.pdf"}, {"key": "fileNameEdit", "keys": "Return"}]]}})json";
    EXPECT_EQ(kest2(u"load ADQT_1008.xml"_s, QByteArray(script).replace("%1", profile.root().toLocal8Bit())).exitCode,
              app::Done);
    EXPECT_TRUE(QFile::exists(profile.root() + u"/saved.pdf"_s));
    EXPECT_FALSE(QFile::exists(profile.root() + u"/.config"_s));
    EXPECT_FALSE(QFile::exists(profile.root() + u"/windows.ini"_s));
}

TEST(DemoProfile, HasAKESTWebThatWorksOnItsOwnProfile)
{
    const TestProfile profile;
    const QString place = profile.root() + u"/it's a demo"_s;
    const auto ends = [&](const QStringList& words) {
        return QProcess::execute(QStringLiteral(KEST_COMMAND), QStringList{u"--profile"_s, place} + words);
    };
    ASSERT_EQ(ends({u"init"_s, u"--demo"_s}), app::Done);
    QProcess web;
    qunsetenv("KEST2_PROFILE");
    web.start(place + u"/component/KESTWeb.exe"_s);
    const QString unread = place + u"/drive_c/wirdoc/AUnread"_s;
    for (int waited = 0; files::list(unread, u"WEB_*"_s).isEmpty() && waited < 20'000; waited += 20)
        web.waitForFinished(20);
    EXPECT_EQ(files::list(unread, u"WEB_*"_s), QStringList(u"WEB_000001_QREQ_20601.xml"_s));
    EXPECT_EQ(ends({u"transport"_s, u"--once"_s}), app::Refused) << "one is enough";
    web.terminate();
    EXPECT_TRUE(web.waitForFinished());
    EXPECT_EQ(web.exitStatus(), QProcess::NormalExit);
    EXPECT_EQ(web.exitCode(), app::Done);
}

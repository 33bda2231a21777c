// Tests the error log: where an error is reported, and a log that is full.
#include "base/modLoggerEx.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"

struct ErrorLog : ::testing::Test {
    ErrorLog() { files::makeFolder(profile::componentFolder()); }
    static void report(int mode) { LogError(7, u"modX.LoadY"_s, u"94"_s, u"Null here"_s, u"LoadY"_s, mode); }

    test::TestProfile profile;
    test::ScriptedDesktop desktop;
};

TEST_F(ErrorLog, TheModeSaysWhereAnErrorIsReported)
{
    report(2);
    EXPECT_EQ(desktop.boxes().size(), 0);
    report(BoxOnly);
    EXPECT_EQ(desktop.boxes().size(), 1);
    EXPECT_FALSE(files::exists(errorLogPath()));
    report(BoxAndFile);
    report(BoxAndFile);
    const auto box =
        u"critical|LoadY|Line No: 7\r\nSource: modX.LoadY\r\nError Number: 94\r\nDescription: Null here|ok"_s;
    EXPECT_EQ(desktop.boxes(), QStringList({box, box, box}));
    const QRegularExpression twoRecords(
        u"^(\\d\\d/\\d\\d/\\d{4} \\d\\d?:\\d\\d:\\d\\d [AP]M: Line No: 7\r\n\t\tSource: modX\\.LoadY\r\n"
        "\t\tError Number: 94\r\n\t\tDescription: Null here\r\n){2}$"_s);
    EXPECT_TRUE(twoRecords.match(files::read(errorLogPath())).hasMatch()) << files::read(errorLogPath());
}

TEST_F(ErrorLog, AFullFileStartsAnew)
{
    EXPECT_FALSE(LogIsFull(errorLogPath()));
    files::write(errorLogPath(), QString(1'048'575, u'x'));
    report(BoxAndFile);
    EXPECT_GT(files::size(errorLogPath()), 1'048'576);
    files::write(errorLogPath(), QString(1'048'576, u'x'));
    report(BoxAndFile);
    EXPECT_LT(files::size(errorLogPath()), 200);
}

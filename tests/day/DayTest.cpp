// Plays the day of the demo shop, and compares what each step leaves.
#include "base/CredentialCipher.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "day/Day.h"
#include "day/DayPage.h"
#include "jobexport/JobLinkSettings.h"
#include "platform/files/Background.h"
#include "setup/Profile.h"
#include "shell/component.h"
#include "support/MariaDbServer.h"
#include "support/Test.h"

/// What a clerk would look at: quotes with their notes and lines, files, and the jobs in JobLink.
using Holdings = QMap<QString, QString>;

/// Returns the columns of each row under the value of its first column, and the names of the files.
static Holdings found(const MariaDbServer& server)
{
    Holdings all;
    const auto jobLink = std::make_shared<db::Connection>();
    jobLink->open(server.connectionText(u"jobs"_s));
    for (const auto& [database, select] : casesIn<2>("app/day-rows.txt")) {
        db::Recordset rows(database == "JobLink"_L1 ? jobLink : gConn);
        for (rows.open(select); !rows.eof(); rows.moveNext()) {
            QStringList values;
            for (const QString& column : rows.columns().sliced(1))
                values << column + u' ' + (rows.text(column).isEmpty() ? u"-"_s : rows.text(column));
            all[rows.text(rows.columns().first())] =
                values.join(u", "_s).replace(shortDate(QDate::currentDate()), u"today"_s);
        }
    }
    for (const auto& [name, path] : {std::pair(u"unread "_s, gsUnreadPath),
                                     {u"read "_s, gsReadPath},
                                     {u"unsent "_s, gsUnsentPath},
                                     {u"sent "_s, gsSentPath},
                                     {u"PDF "_s, gsReadPath + u"..\\PDF\\"_s},
                                     {u"images "_s, gsImagesPath}})
        for (const QString& file : files::list(path))
            all[name + file];
    return all;
}

static QStringList changes(const Holdings& before, const Holdings& after)
{
    QStringList lines;
    for (auto was = before.begin(); was != before.end(); ++was)
        if (!after.contains(was.key()))
            lines << u"- "_s + was.key();
    for (auto is = after.begin(); is != after.end(); ++is)
        if (!before.contains(is.key()) || before[is.key()] != *is)
            lines << (u"+ "_s + is.key() + (is->isEmpty() ? QString() : u": "_s + *is));
    return lines;
}

/// Returns the boxes with their exact texts, the reports and documents, and the rows of each list that was read.
static QStringList told(const desktop::Record& record)
{
    QStringList lines;
    for (const QJsonValue box : record.boxes)
        lines << u"box %1: %2"_s.arg(box[u"icon"].toString(), box[u"text"].toString().replace(u"\r\n"_s, u" / "_s));
    for (const QJsonValue window : record.windows)
        if (window[u"name"] == u"frmPrintPreview"_s)
            lines << u"report %1: %2 rows"_s.arg(window[u"report"].toInt())
                         .arg(window[u"table"][u"rows"].toArray().size());
    for (const QJsonValue read : record.reads)
        for (const QJsonValue row : read[u"values"][u"ListView1"][u"rows"].toArray()) {
            QStringList cells;
            for (const QJsonValue cell : row.toArray())
                cells << cell.toString();
            lines << u"row "_s + cells.join(u" | "_s);
        }
    return lines;
}

/// Reads the expected lines of each step. In the file they follow a line "== step".
static QMap<QString, QStringList> expectedSteps()
{
    QMap<QString, QStringList> steps;
    QString step;
    for (const QString& line : test::linesOf("app/day.txt"))
        if (line.startsWith(u"== "_s))
            steps[step = line.sliced(3)];
        else
            steps[step] << line;
    return steps;
}

/// Checks that every window and every report has a picture that is not empty.
static void checkPictures(const QDir& pictures)
{
    for (const QString& window :
         u"comparison extra-information login messages panel sublet-document text transport "
         "utilities report-1-710 report-1-720 report-1-730"_s.split(u' '))
        EXPECT_FALSE(pictures.entryList({u"*-"_s + window + u".png"_s}).isEmpty()) << window;
    const QString page = QString::fromUtf8(files::readBytes(pictures.filePath(u"index.html"_s)));
    EXPECT_TRUE(page.contains(u"Damage Description must be entered."_s)) << "the page shows the boxes";
    for (const QString& file : pictures.entryList({u"*.png"_s})) {
        EXPECT_TRUE(page.contains(u"<img src=\"%1\""_s.arg(file))) << file;
        const QImage picture(pictures.filePath(file));
        QImage blank = picture;
        blank.fill(picture.pixelColor(0, 0));
        EXPECT_FALSE(picture == blank) << file;
    }
}

TEST(Day, LeavesAfterEachStepWhatItShould)
{
    const QMap<QString, QStringList> expected = expectedSteps();
    EXPECT_EQ(app::Day::steps(), expected.keys());
    MariaDbServer server;
    server.createDatabase(u"jobs"_s, files::read(checkoutFile(u"sql/joblink.sql"_s)));
    const TestProfile profile;
    const QDir pictures(profile.root() + u"/pictures"_s);
    app::initProfile(registerClass, app::Shop::Demo);
    app::Day day(pictures.path());
    app::DayPage page(pictures.path());
    InitCipherKey();
    storeJobLinkSettings({u"127.0.0.1"_s, server.port(), u"jobs"_s, server.user(), server.password()});
    Holdings before;
    for (const QString& step : app::Day::steps()) {
        const desktop::Record shown = day.play(step);
        page.add(step, shown);
        QStringList lines = told(shown);
        EXPECT_TRUE(files::waitForBackground(5000));
        const Holdings after = found(server);
        if (!before.isEmpty() && !step.endsWith(u".sql"_s))
            lines << changes(before, after);
        before = after;
        EXPECT_EQ(expected[step].join(u'\n').toStdString(), lines.join(u'\n').toStdString()) << step;
    }
    checkPictures(pictures);
}

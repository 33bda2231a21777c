#include "app/DemoShop.h"
#include "app/Profile.h"
#include "app/QuoteDatabase.h"
#include "messages/Envelope.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/settings/registry.h"
#include "platform/values.h"
#include "support/TestProfile.h"

#include <QDirIterator>
#include <QFile>
#include <QImage>
#include <QJsonObject>
#include <QMap>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>

#include <gtest/gtest.h>

#include <algorithm>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

const QDate today(2008, 3, 21);

/// What lies there, the databases aside.
QMap<QString, QByteArray> filesUnder(const QString& folder)
{
    QMap<QString, QByteArray> contents;
    for (QDirIterator at(folder, QDir::Files, QDirIterator::Subdirectories); at.hasNext();) {
        QFile file(at.next());
        if (file.fileName().contains(u"/databases/"_s))
            continue;
        EXPECT_TRUE(file.open(QIODevice::ReadOnly));
        contents[file.fileName()] = file.readAll();
    }
    return contents;
}

db::Recordset opened(const QString& select)
{
    db::Recordset rows(app::openEmbedded(u"WirSql"_s));
    rows.open(select);
    return rows;
}

/// The first column of each row as text.
QStringList listed(const QString& select)
{
    QStringList texts;
    for (db::Recordset rows = opened(select); !rows.eof(); rows.moveNext())
        texts << rows.text(rows.columns().first());
    return texts;
}

class Profile : public ::testing::Test {
protected:
    TestProfile profile;
};

}  // namespace

TEST_F(Profile, IsMadeWhole)
{
    EXPECT_TRUE(app::initProfile(false));

    const QJsonObject where = app::where();
    EXPECT_EQ(where.keys(), QStringList({u"component"_s, u"database"_s, u"images"_s, u"log"_s, u"pdf"_s, u"profile"_s,
                                         u"read"_s, u"reports"_s, u"sent"_s, u"unread"_s, u"unsent"_s}));
    for (const QString& key : where.keys())
        EXPECT_TRUE(key == u"log"_s || QFileInfo::exists(where[key].toString())) << key.toStdString();
    EXPECT_EQ(where[u"unread"_s].toString(), profile.driveC() + u"/wirdoc/AUnread"_s);

    // what a first quote request needs
    EXPECT_EQ(listed(u"SELECT NAME FROM INSURER WHERE KEST=1"_s), QStringList(u"KEST Universal Insurer"_s));
    EXPECT_EQ(listed(u"SELECT MODEL_ID FROM MODEL WHERE MODEL_ID1='Z000'"_s).size(), 1);
    EXPECT_EQ(listed(u"SELECT QUOTE_VAL FROM CINFO"_s).size(), 1);
    EXPECT_EQ(listed(u"SELECT ReportID FROM ReportDefinition ORDER BY ReportID"_s),
              QStringList({u"710"_s, u"720"_s, u"730"_s}));
    EXPECT_TRUE(listed(u"SELECT QTNNO FROM QUOTE1"_s).isEmpty());
}

TEST_F(Profile, IsNotTouchedOnceItExists)
{
    EXPECT_TRUE(app::initProfile(false, today));
    EXPECT_TRUE(settings::setValue(settings::Hive::LocalMachine, u"SOFTWARE\\wirra32\\frmsplash"_s, u"ImagesPath"_s,
                                   {settings::Type::Text, u"d:\\pictures\\"_s}));
    const auto before = filesUnder(profile.root());

    EXPECT_FALSE(app::initProfile(true, today));

    EXPECT_EQ(filesUnder(profile.root()), before);
    EXPECT_TRUE(listed(u"SELECT QTNNO FROM QUOTE1"_s).isEmpty());
    EXPECT_EQ(app::where()[u"images"_s].toString(), profile.root() + u"/drive_d/pictures"_s);
}

TEST_F(Profile, IsCompletedAfterAnInterruptedStart)
{
    files::makeFolder(profile.root() + u"/databases"_s);
    files::writeBytes(app::embeddedFile(u"unfinished"_s), "half a file");
    EXPECT_TRUE(app::initProfile(false));
    EXPECT_EQ(listed(u"SELECT QUOTE_VAL FROM CINFO"_s).size(), 1);
    EXPECT_FALSE(QFileInfo::exists(app::embeddedFile(u"unfinished"_s)));
}

// Other tools compare only the letters of ASCII without regard to case, and leave the others in another order.
TEST_F(Profile, FindsWhatAnotherToolWroteOnceInitHasRebuiltTheIndexes)
{
    ASSERT_TRUE(app::initProfile(false));
    QStringList regos;
    for (int number = 10; number < 50; ++number)
        regos << (number % 2 ? u'\u00e9' : u'\u00c9') + QString::number(number);
    {
        QSqlDatabase tool = QSqlDatabase::addDatabase(u"QSQLITE"_s, u"tool"_s);
        tool.setDatabaseName(app::embeddedFile(u"WirSql"_s));
        ASSERT_TRUE(tool.open());
        for (const QString& rego : regos)
            EXPECT_FALSE(tool.exec(u"INSERT INTO CAR (REGO) VALUES ('%1')"_s.arg(rego)).lastError().isValid());
    }
    QSqlDatabase::removeDatabase(u"tool"_s);
    const auto found = [&] {
        return std::ranges::count_if(regos, [](const QString& rego) {
            return listed(sql("SELECT REGO FROM CAR WHERE REGO='{}'", rego)).size() == 1;
        });
    };
    ASSERT_LT(found(), regos.size());

    EXPECT_FALSE(app::initProfile(false));

    EXPECT_EQ(found(), regos.size());
}

TEST_F(Profile, TheDemoShopHoldsTogether)
{
    ASSERT_TRUE(app::initProfile(true, today));

    const std::pair<const char*, QString> nothing[] = {
        {"a quote without long texts",
         u"SELECT QTNNO FROM QUOTE1 WHERE NOT EXISTS (SELECT 1 FROM QUOTE3 WHERE "
         "QUOTE3.QTNNO=QUOTE1.QTNNO AND QUOTE3.Subquote=QUOTE1.Subquote)"_s},
        {"a quote without lines",
         u"SELECT QTNNO FROM QUOTE1 WHERE NOT EXISTS (SELECT 1 FROM QUOTE2 WHERE "
         "QUOTE2.QTNNO=QUOTE1.QTNNO AND QUOTE2.Subquote=QUOTE1.Subquote)"_s},
        {"a quote without insurer",
         u"SELECT QTNNO FROM QUOTE1 WHERE INSURER_ID NOT IN (SELECT INSURER_ID FROM INSURER)"_s},
        {"a quote without car", u"SELECT QTNNO FROM QUOTE1 WHERE REGO NOT IN (SELECT REGO FROM CAR)"_s},
        {"a car without customer", u"SELECT REGO FROM CAR WHERE CUST_ID NOT IN (SELECT CUST_ID FROM CUSTOMER)"_s},
        {"a car without model", u"SELECT REGO FROM CAR WHERE MODEL_ID NOT IN (SELECT MODEL_ID FROM ALLMODEL)"_s},
        {"a car of unknown colour", u"SELECT REGO FROM CAR WHERE COLOUR NOT IN (SELECT Script FROM KESTColours)"_s},
        {"a line without vendor",
         u"SELECT script FROM QUOTE2 WHERE VENDOR>0 AND VENDOR NOT IN (SELECT VENDOR_ID FROM VENDOR)"_s},
        {"an unknown stage", u"SELECT QTNNO FROM QUOTE1 WHERE Job_stage NOT IN (SELECT stage FROM JOBSTAGE)"_s},
        {"a supplementary quote without main quote",
         u"SELECT QTNNO FROM QUOTE1 WHERE Subquote>0 AND QTNNO NOT IN "
         "(SELECT QTNNO FROM QUOTE1 WHERE Subquote=0)"_s},
    };
    for (const auto& [what, select] : nothing)
        EXPECT_EQ(listed(select), QStringList()) << what;
    EXPECT_EQ(listed(u"SELECT QTNNO FROM QUOTE1"_s).size(), 30);
    EXPECT_EQ(listed(u"SELECT DISTINCT category FROM QUOTE2"_s).size(), 6);
    EXPECT_EQ(listed(u"SELECT remarks FROM QUOTE3 WHERE QTNNO='1003'"_s),
              QStringList(u"(15/03/2008 : Active Quote Request)"_s));
    EXPECT_EQ(listed(u"SELECT qtndate FROM QUOTE1 WHERE QTNNO='1003'"_s), QStringList(u"15/03/2008"_s));

    // the next number that the shop gives is free
    EXPECT_EQ(listed(u"SELECT QTNNO FROM QUOTE1 WHERE QTNNO=(SELECT QUOTE_VAL FROM CINFO)"_s), QStringList());
}

TEST_F(Profile, TheDemoMessagesParseAfterRepair)
{
    ASSERT_TRUE(app::initProfile(true, today));
    const QString home = profile.driveC() + u"/wirdoc/"_s;

    QStringList types;
    QStringList unreadable;
    for (const QString& folder : {home + u"AUnread/"_s, home + u"ARead/"_s})
        for (const QString& name : files::list(folder, u"*.xml"_s)) {
            QString text = files::read(folder + name);
            xml::Document message = ParsedMessage(text);
            if (message.parseError().errorCode == xml::BareAmpersand)
                message.loadXML(WithAmpersandsEscaped(text));
            if (message.documentElement().isNull()) {
                unreadable << name;
                continue;
            }
            if (name.startsWith(u"R_"_s) || name.contains(u"MDMSG"_s))
                continue;
            types << message.textOf(u"messageType"_s);
            EXPECT_TRUE(folder.endsWith(u"ARead/"_s) || name.startsWith(types.last())) << name.toStdString();
        }
    types.removeDuplicates();
    types.sort();
    EXPECT_EQ(types.join(u' '), u"ADQT ARES AUQT BACA BCQR EWAP MANQ QMQR QRCN QREQ QTDL RRQT"_s);
    EXPECT_EQ(unreadable, QStringList(u"QREQ_20554_1.xml"_s));

    for (const QString& name : files::list(home + u"ASent"_s)) {
        xml::Document document;
        EXPECT_TRUE(document.loadXML(WrappedInRequest(files::read(home + u"ASent/"_s + name)))) << name.toStdString();
        EXPECT_TRUE(name.startsWith(document.textOf(u"//quoteReference"_s).replace(u'/', u'.'))) << name.toStdString();
    }
}

TEST_F(Profile, TheDemoPhotographsArePictures)
{
    ASSERT_TRUE(app::initProfile(true, today));
    QStringList pictures;
    for (const QString& folder : {profile.driveC() + u"/wirdoc/AUnread/"_s, profile.driveC() + u"/wirimg/"_s})
        for (const QString& name : files::list(folder, u"*.jpg"_s)) {
            pictures << name;
            EXPECT_FALSE(QImage(folder + name).isNull()) << name.toStdString();
        }
    EXPECT_EQ(pictures.filter(u"20551_"_s).size(), 3);
    EXPECT_EQ(pictures.filter(u"20553_"_s).size(), 0) << "the request that waits for its picture";
    EXPECT_EQ(app::drawn({u"same"_s, Qt::blue, 0.5}), app::drawn({u"same"_s, Qt::blue, 0.5}));
}

TEST(Statements, AreSplitOutsideLiteralsAndWithoutComments)
{
    EXPECT_EQ(app::statementsIn(u"-- first; of all\nA 'x;y''--' B;\n\nC; -- end"_s),
              QStringList({u"A 'x;y''--' B"_s, u"C"_s}));
}

TEST(Dates, CountFromToday)
{
    EXPECT_EQ(app::withDates(u"'@date-21@ 00:00:00' (@short+11@ : x) @home"_s, today),
              u"'2008-02-29 00:00:00' (01/04/2008 : x) @home"_s);
}

}  // namespace kest::test

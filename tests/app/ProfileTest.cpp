#include "app/Profile.h"
#include "app/QuoteDatabase.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/settings/registry.h"
#include "platform/values.h"
#include "shell/ModRegistry.h"
#include "support/TestProfile.h"

#include <QDirIterator>
#include <QFile>
#include <QJsonObject>
#include <QMap>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>
#include <QTemporaryDir>

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
    EXPECT_EQ(where.keys().join(u' '), u"component database images log pdf profile read reports sent unread unsent"_s);
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
    // and a host's first start, which copies the settings up that it reads
    GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"EcomHome"_s, u"d:\\mail\\"_s);
    EXPECT_TRUE(app::initProfile(false));
    EXPECT_EQ(listed(u"SELECT QUOTE_VAL FROM CINFO"_s).size(), 1);
    EXPECT_FALSE(QFileInfo::exists(app::embeddedFile(u"unfinished"_s)));
    EXPECT_EQ(app::where()[u"unread"_s].toString(), profile.root() + u"/drive_d/mail/AUnread"_s);
    EXPECT_TRUE(QFileInfo::exists(app::where()[u"unread"_s].toString()));
    EXPECT_FALSE(app::initProfile(false));
}

TEST_F(Profile, IsToldWhereTheComponentLooks)
{
    ASSERT_TRUE(settings::setUserSetting(u"wirra32"_s, u"frmsplash"_s, u"ReportPath"_s, u"d:\\rep\\"_s));
    EXPECT_EQ(app::where()[u"reports"_s].toString(), profile.root() + u"/drive_d/rep"_s);
    EXPECT_EQ(app::where()[u"database"_s].toString(), app::embeddedFile(u"WirSql"_s));

    const QTemporaryDir odbc;
    QFile drivers(odbc.filePath(u"odbcinst.ini"_s));
    ASSERT_TRUE(drivers.open(QIODevice::WriteOnly) && drivers.write("[SQL Server]\n") > 0);
    drivers.close();
    qputenv("ODBCSYSINI", QFile::encodeName(odbc.path()));
    EXPECT_EQ(app::where()[u"database"_s].toString(), u"(local)/WirSql"_s);
    qunsetenv("ODBCSYSINI");
    EXPECT_FALSE(settings::keyExists(settings::Hive::LocalMachine, u"SOFTWARE"_s)) << "nothing is copied up";
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

// A line that a load adds counts in totals and documents; what was never filled in stays told apart from 0.
TEST_F(Profile, ItsTablesTakeWhatAHostWrites)
{
    ASSERT_TRUE(app::initProfile(false));
    db::ConnectionPtr database = app::openEmbedded(u"WirSql"_s);
    database->execute(u"INSERT INTO QUOTE2 (QTNNO) VALUES ('9')"_s);
    db::Recordset line = opened(u"SELECT * FROM QUOTE2"_s);
    for (const char* column : {"rrhour", "rahour", "pthour", "rr_rate2", "opg_rate", "qty", "unitcost", "VENDOR",
                               "blend", "delitem", "DELETEDITEM", "Report", "Report_on"})
        EXPECT_TRUE(!line.isNull(QString::fromLatin1(column)) && toDouble(line.value(QString::fromLatin1(column))) == 0)
            << column;
    for (const char* column : {"SEQ_NO", "allow_tick", "itemno", "PartNo", "MARK"})
        EXPECT_TRUE(line.isNull(QString::fromLatin1(column))) << column;

    for (int twice = 0; twice < 2; ++twice)
        database->execute(u"INSERT INTO QUOTE1 (QTNNO, Subquote) VALUES ('9', 0)"_s);
    EXPECT_EQ(listed(u"SELECT rec_id FROM QUOTE1 WHERE QTNNO='9'"_s), QStringList({u"1"_s, u"2"_s}));
    database->execute(u"INSERT INTO CAR (REGO) VALUES ('ABC123')"_s);
    EXPECT_THROW(database->execute(u"INSERT INTO CAR (REGO) VALUES ('abc123 ')"_s), RuntimeError);
}

TEST(Schema, HasTheSameColumnsOnAllEngines)
{
    const auto columns = [](const QString& name) {
        QStringList words;
        const QStringList lines = files::read(QStringLiteral(KEST_SOURCE_DIR "/sql/") + name).split(u'\n');
        for (const QString& line : lines)
            if (!line.startsWith(u"--"_s) && !line.startsWith(u')'))
                words << line.simplified().section(u' ', 0, line.startsWith(u' ') ? 0 : 2) +
                             (line.contains(u"DEFAULT 0"_s) ? u" 0"_s : QString());
        return words;
    };
    EXPECT_EQ(columns(u"quote-embedded.sql"_s), columns(u"quote-mariadb.sql"_s));
}

TEST(Statements, AreSplitOutsideLiteralsAndWithoutComments)
{
    EXPECT_EQ(app::statementsIn(u"-- first; of all\nA 'x;y''--' B;\n\nC; -- end"_s),
              QStringList({u"A 'x;y''--' B"_s, u"C"_s}));
}

}  // namespace kest::test

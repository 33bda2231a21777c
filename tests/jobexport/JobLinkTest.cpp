// The export against a real server: what JobLink finds, and what is left of an export that failed.
#include "jobexport/JobLinkSettings.h"
#include "jobexport/WriteQuote.h"
#include "platform/database/FaultInjection.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "shell/CredentialCipher.h"
#include "shell/SharedVariables.h"
#include "support/MariaDbServer.h"
#include "support/ScriptedDesktop.h"
#include "support/Shop.h"

#include <QElapsedTimer>
#include <QFile>

#include <gtest/gtest.h>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

QString jobLinkTables()
{
    QFile script(QStringLiteral(KEST_SOURCE_DIR) + u"/sql/joblink.sql"_s);
    EXPECT_TRUE(script.open(QIODevice::ReadOnly));
    return QString::fromUtf8(script.readAll());
}

class JobLink : public Shop {
protected:
    JobLink()
    {
        mariaDb().createDatabase(u"jobs"_s, jobLinkTables());
        jobs = std::make_shared<db::Connection>();
        jobs->open(mariaDb().connectionText(u"jobs"_s));
        InitCipherKey();
        store(mariaDb().password());
        car("ABC123").set("PAINT_GP", "M1").set("XMission", "Manual").set("Year", "03/2005");
        quote("500").set("qtndate", QDate(2008, 3, 21)).set("QUOTER", "Sam").set("policy_no", "P7");
    }
    ~JobLink() override { db::setStatementFault({}); }

    static void store(const QString& password)
    {
        StoreJobLinkSettings({u"127.0.0.1"_s, mariaDb().port(), u"jobs"_s, mariaDb().user(), password});
    }

    db::Recordset rows(const char* select) const
    {
        db::Recordset found(jobs);
        found.open(QString::fromLatin1(select));
        return found;
    }
    std::string header(const char* column) const
    {
        return rows("SELECT * FROM newJobHdr ORDER BY nJobHdr_PK DESC").text(QString::fromLatin1(column)).toStdString();
    }
    /// A column of all detail rows in the order of their writing; "null" for Null.
    std::string details(const char* column) const
    {
        QStringList texts;
        for (auto found = rows("SELECT * FROM newJobDtl ORDER BY nJobDtlID_PK"); !found.eof(); found.moveNext()) {
            const QString name = QString::fromLatin1(column);
            texts << (found.isNull(name) ? u"null"_s : found.text(name));
        }
        return texts.join(u'|').toStdString();
    }
    int statusOfTheJob() const
    {
        auto found = rows("SELECT Status FROM newJob ORDER BY nJobID_PK DESC");
        return found.eof() ? -1 : found.text(u"Status"_s).toInt();
    }

    db::ConnectionPtr jobs;
};

TEST_F(JobLink, AShopWithoutJobLinkExportsNothing)
{
    gConn->execute(u"DELETE FROM ExternalSettings"_s);
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_EQ(statusOfTheJob(), -1);
    EXPECT_EQ(shown(), "");
}

TEST_F(JobLink, TheHeaderHoldsQuoteCarAndPeople)
{
    const std::string insurer = quote("500").text("INSURER_ID");
    gConn->execute(
        sql("UPDATE INSURER SET street='1 HIGH ST', suburb='RICHMOND 3121', phone='03 1' WHERE INSURER_ID={}",
            QString::fromStdString(insurer).toInt()));
    customer("Holloway").set("street", "Unit 2\\3 O'Hara's Row").set("suburb", "Zoë's Point").set("SALUTATION", "");
    WriteQuote(u"500"_s, u"0"_s);

    std::string found;
    for (const char* column : {"JobNr", "estNr", "estimateDate", "startDate", "paintType", "insPcode", "insAddr",
                               "insPh", "custPcode", "custAddr", "vehReg", "vehMonth", "vehYear", "vehTrans",
                               "estimator", "insPolicyNr", "invoiceDate", "jobNotes"})
        found += header(column) + '|';
    EXPECT_EQ(found,
              "500|500|21/03/2008||M1|3121|1 HIGH ST, RICHMOND|03 1||Unit 2\\3 O'Hara's Row, Zoë's Point|"
              "ABC123|03|2005|Manual|Sam|P7|||");
    EXPECT_EQ(header("custName"), " " + customer("Holloway").text("FIRSTNAME") + " Holloway");
    EXPECT_EQ(details("coreTitle"), "");
    EXPECT_EQ(statusOfTheJob(), 1);
    EXPECT_EQ(shown(), "");
}

TEST_F(JobLink, AddressesAreTakenApartAsAPersonWouldReadThem)
{
    struct Case {
        Value street, suburb;
        const char *address, *customerCode, *insurerCode;
    };
    const Case cases[] = {{"1 HIGH ST", "RICHMOND 3121", "1 HIGH ST, RICHMOND", "3121", "3121"},
                          {"", "RICHMOND", "RICHMOND", "", "0"},
                          {"1 HIGH ST", "EAST RICHMOND", "1 HIGH ST, EAST RICHMOND", "", "0"},
                          {"1 HIGH ST", "RICHMOND V3121", "1 HIGH ST, RICHMOND V3121", "", "0"},
                          {nullptr, "RICHMOND 3121", "", "", ""}};
    for (const Case& c : cases) {
        customer("Holloway").set("street", c.street).set("suburb", c.suburb);
        RowOf<LineRow>("INSURER", "INSURER_ID=" + quote("500").text("INSURER_ID"))
            .set("street", c.street)
            .set("suburb", c.suburb);
        WriteQuote(u"500"_s, u"0"_s);
        EXPECT_EQ(header("custAddr"), c.address);
        EXPECT_EQ(header("insAddr"), c.address);
        EXPECT_EQ(header("custPcode"), c.customerCode) << c.address;
        EXPECT_EQ(header("insPcode"), c.insurerCode) << c.address;
    }
}

TEST_F(JobLink, LinesOfAllSubquotesGoInTheirOrder)
{
    quote("500", 1);
    const int spoiler = vendor("Spoiler World").id();
    quote("500").line(3, "PRT", "door").set("rrhour", 10.005).set("qty", 2).set("MARK", " ").set("PartNo", "X1");
    quote("500").line(1, "R&R", "strip").set("rrhour", 2.5).set("rr_rate2", 40).set("MARK", "X");
    quote("500", 1).line(2, "MIS", "tow").set("unitcost", 99.5).set("PartNo", "SUBL").set("VENDOR", spoiler);
    quote("500").line(4, "OPG", "blend").set("pthour", 3).set("opg_rate", 20).set("MARK", "Q");
    quote("500").line(5, "odd", "other").set("MARK", "U").set("VENDOR", nullptr);
    quote("500").line(6, "RA", "gone").set("tosend", "D");
    for (int line = 1; line <= 5; ++line)
        quote("500", line == 2).line(line).set("tosend", "A");
    quote("500").remarks("second", "anno_paint").remarks("first", "anno_rr").remarks("", "anno_misc");
    WriteQuote(u"500"_s, u"0"_s);

    EXPECT_EQ(details("lineNr"), "1|2|3|4|5|900|902|905");
    EXPECT_TRUE(details("lineDescn").ends_with("|first|second|"));
    EXPECT_TRUE(details("coreTitle").starts_with("R&R|SUBL|PRT|OPG|odd|"));
    EXPECT_TRUE(details("lineSale").starts_with("100|99.5|20.01|60|null|"));
    EXPECT_EQ(details("linePartType"), "EXCHANGE|OEM|OEM|null|USED|null|null|null");
    EXPECT_TRUE(details("linePartNr").starts_with("null|null|X1|null|null|"));
    EXPECT_TRUE(details("lineSupplierName").starts_with("|Spoiler World|||"));
}

TEST_F(JobLink, ALineThatAMarkerPointsAtIsLeftOut)
{
    quote("500").line(1, "RA", "old").set("tosend", "A");
    const QString replaced = QString::fromStdString(quote("500").line(1).text("itemid"));
    quote("500").line(2, "RA", "new").set("tosend", "A").set("DELETEDITEM", replaced.toInt());
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_EQ(details("lineDescn"), "new");
}

TEST_F(JobLink, WhatTheHeaderNeedsAndLacksIsTold)
{
    quote("500").set("qtndate", nullptr);
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_EQ(statusOfTheJob(), 0);
    EXPECT_NE(shown().find("Wirra32.KEST2.modLoadXML.WriteQuote"), std::string::npos);

    quote("500").set("qtndate", QDate(2008, 3, 21));
    car("ABC123").set("MODEL_ID", nullptr);
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_TRUE(rows("SELECT * FROM newJobHdr").eof());
    EXPECT_NE(shown().find("Wirra32.KEST2.modLoadXML.WriteQuote"), std::string::npos);

    car("ABC123").set("CUST_ID", nullptr);
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_EQ(shown(), "[critical] Quote could not be exported to JobLink.");
    EXPECT_EQ(statusOfTheJob(), 0);
}

TEST_F(JobLink, AKeyOfMoreThan16BitsLeavesTheJobUnfinished)
{
    jobs->execute(u"ALTER TABLE newJob AUTO_INCREMENT = 32768"_s);
    quote("500").line(1).set("tosend", "A");
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_EQ(details("lineNr"), "1");
    EXPECT_EQ(statusOfTheJob(), 0);
    EXPECT_NE(shown(), "");
}

TEST_F(JobLink, AServerThatRefusesIsPassedOverInSilence)
{
    store(u"wrong"_s);
    WriteQuote(u"500"_s, u"0"_s);
    StoreJobLinkSettings({u"127.0.0.1"_s, 1, u"jobs"_s, mariaDb().user(), mariaDb().password()});
    QElapsedTimer clock;
    clock.start();
    WriteQuote(u"500"_s, u"0"_s);
    EXPECT_LT(clock.elapsed(), 10'000);
    EXPECT_EQ(statusOfTheJob(), -1);
    EXPECT_EQ(shown(), "");
}

TEST_F(JobLink, AFailureAtAnyStatementLeavesNoHalfJobThatLooksWhole)
{
    quote("500").line(1).set("tosend", "A").set("VENDOR", vendor("Spoiler World").id());
    quote("500").line(2).set("tosend", "A");
    quote("500").remarks("note", "anno_rr");
    int statements = 0;
    db::setStatementFault([&] { return ++statements < 0; });
    WriteQuote(u"500"_s, u"0"_s);
    db::setStatementFault({});
    ASSERT_EQ(statusOfTheJob(), 1);

    for (int failing = 1; failing <= statements; ++failing) {
        jobs->execute(u"DELETE FROM newJob"_s);
        jobs->execute(u"DELETE FROM newJobDtl"_s);
        int statement = 0;
        db::setStatementFault([&] { return ++statement == failing; });
        EXPECT_NO_THROW(WriteQuote(u"500"_s, u"0"_s)) << failing;
        db::setStatementFault({});
        if (statusOfTheJob() == 1) {
            EXPECT_EQ(details("lineNr"), "1|2|900") << failing;
        }
    }
}

TEST(Cipher, WhatIsStoredComesBack)
{
    InitCipherKey();
    for (const QString& plain : {u""_s, u"a"_s, u"12345678"_s, u"naïve £5 – secret"_s}) {
        const QString stored = EncryptText(plain);
        EXPECT_EQ(DecryptText(stored), plain);
        EXPECT_EQ(DecryptText(stored.toUpper()), plain);
        EXPECT_EQ(DecryptText(stored + u"00112233445566"_s), plain);
    }
    for (const QString& pair : {u"zz"_s, u"a "_s, u"\ta"_s, u"+a"_s})
        EXPECT_THROW(DecryptText(pair + u"00112233445566"_s), RuntimeError) << pair.toStdString();
}

}  // namespace
}  // namespace kest::test

// Tests the export with a real server: what JobLink gets, and what remains of a failed export.
#include "base/CredentialCipher.h"
#include "jobexport/JobLinkSettings.h"
#include "jobexport/WriteQuote.h"
#include "support/MariaDbServer.h"
#include "support/Shop.h"

struct JobLink : Shop {
    JobLink()
    {
        mariaDb().createDatabase(u"jobs"_s, files::read(checkoutFile(u"sql/joblink.sql"_s)));
        jobs = std::make_shared<db::Connection>();
        jobs->open(mariaDb().connectionText(u"jobs"_s));
        InitCipherKey();
        store(mariaDb().password());
        fill(car("ABC123"), "PAINT_GP=M1 XMission=Manual Year=03/2005");
        fill(quote("500"), "qtndate=2008-03-21 QUOTER=Sam policy_no=P7");
    }

    static void store(const QString& password)
    {
        storeJobLinkSettings({u"127.0.0.1"_s, mariaDb().port(), u"jobs"_s, mariaDb().user(), password});
    }

    /// Returns the rows that a query finds in JobLink, such as "1/null|2/x", with "null" for Null.
    std::string rows(const Text& select) const
    {
        db::Recordset found(jobs);
        QStringList texts;
        for (found.open(select); !found.eof(); found.moveNext()) {
            QStringList cells;
            for (const QString& name : found.columns())
                cells << (found.isNull(name) ? u"null"_s : found.text(name));
            texts << cells.join(u'/');
        }
        return texts.join(u'|').toStdString();
    }
    std::string header(const std::string& columns) const
    {
        return rows("SELECT " + columns + " FROM newJobHdr ORDER BY nJobHdr_PK DESC LIMIT 1");
    }
    std::string details(const std::string& columns) const
    {
        return rows("SELECT " + columns + " FROM newJobDtl ORDER BY nJobDtlID_PK");
    }
    std::string statusOfTheJob() const { return rows("SELECT Status FROM newJob ORDER BY nJobID_PK DESC LIMIT 1"); }
    static void exportQuote() { WriteQuote(u"500"_s, u"0"_s); }
    static Row insurer() { return Row("INSURER", "INSURER_ID=" + quote("500").text("INSURER_ID")); }

    db::ConnectionPtr jobs;
};

TEST_F(JobLink, TheHeaderHoldsWhatTheShopKnows)
{
    fill(insurer(), "street=1 HIGH ST suburb=RICHMOND 3121 phone=03 1");
    fill(customer("Holloway"), "street=Unit 2\\3 O'Hara's Row suburb=Zoë's Point SALUTATION=");
    int asked = 0;
    db::setConnectionFault([&] { return ++asked < 0; });
    exportQuote();
    db::setConnectionFault({});
    EXPECT_EQ(asked, 3) << "each is a trip: before and after the server of the jobs is asked, not before each question";

    for (const auto& [column, value] : casesIn<2>("jobexport/header.txt"))
        EXPECT_EQ(header(column.toStdString()), value.toStdString()) << column;
    EXPECT_EQ(details("coreTitle"), "");
    EXPECT_EQ(statusOfTheJob(), "1");
    EXPECT_EQ(shown(), "");
}

TEST_F(JobLink, AddressesAreTakenApartAsAPersonWouldReadThem)
{
    for (const auto& [row, address, customerCode, insurerCode] : casesIn<4>("jobexport/addresses.txt")) {
        fill(customer("Holloway"), row);
        fill(insurer(), row);
        exportQuote();
        EXPECT_EQ(header("custAddr, insAddr, custPcode, insPcode"),
                  QStringList({address, address, customerCode, insurerCode}).join(u'/').toStdString());
    }
}

TEST_F(JobLink, LinesOfAllSubquotesGoInTheirOrder)
{
    EXPECT_EQ(vendor("Spoiler World").id(), 1);
    QStringList expected;
    for (const auto& [subquote, number, category, script, columns, exported] : casesIn<6>("jobexport/lines.txt")) {
        if (!number.isEmpty())
            fill(quote("500", subquote.toInt()).line(number.toInt(), category, script), columns);
        if (!exported.isEmpty())
            expected << exported;
    }
    quote("500").remarks("second", "anno_paint").remarks("first", "anno_rr").remarks("", "anno_misc");
    exportQuote();
    EXPECT_EQ(details("lineNr, coreTitle, lineDescn, lineSale, linePartType, linePartNr, lineSupplierName"),
              expected.join(u'|').toStdString());
}

TEST_F(JobLink, AMissingDateIsAnEmptyText)
{
    quote("500").set("qtndate", nullptr);
    addRow("DEBTOR", {{"QTNNO", "500"}});
    exportQuote();
    EXPECT_EQ(statusOfTheJob(), "1");
    EXPECT_EQ(header("estimateDate, invoiceDate"), "/") << "not Null";
}

TEST_F(JobLink, AHeaderThatLacksSomethingIsTold)
{
    car("ABC123").set("MODEL_ID", nullptr);
    exportQuote();
    EXPECT_EQ(header("*"), "");
    EXPECT_EQ(QString::fromStdString(shown()).count(u"Wirra32.KEST2.modLoadXML.WriteQuote"_s), 1);

    car("ABC123").set("CUST_ID", nullptr);
    exportQuote();
    EXPECT_EQ(shown(), "[critical] Quote could not be exported to JobLink.");
    EXPECT_EQ(statusOfTheJob(), "0");
}

TEST_F(JobLink, AKeyOfMoreThan16BitsLeavesTheJobUnfinished)
{
    jobs->execute(u"ALTER TABLE newJob AUTO_INCREMENT = 32768"_s);
    quote("500").line(1).set("tosend", "A");
    exportQuote();
    EXPECT_EQ(details("lineNr"), "1");
    EXPECT_EQ(statusOfTheJob(), "0");
    EXPECT_NE(shown(), "");
}

TEST_F(JobLink, WithoutASettingOrAServerThatAnswersNothingIsExportedOrSaid)
{
    store(u"wrong"_s);
    exportQuote();
    storeJobLinkSettings({u"127.0.0.1"_s, 1, u"jobs"_s, mariaDb().user(), mariaDb().password()});
    QElapsedTimer clock;
    clock.start();
    exportQuote();
    EXPECT_LT(clock.elapsed(), 10'000);
    gConn->execute(u"DELETE FROM ExternalSettings"_s);
    exportQuote();
    EXPECT_EQ(statusOfTheJob(), "");
    EXPECT_EQ(shown(), "");
}

TEST(Cipher, WhatIsStoredComesBack)
{
    InitCipherKey();
    for (const QString& plain : {u""_s, u"a"_s, u"12345678"_s, u"naïve £5 – secret"_s}) {
        const QString stored = encryptText(plain);
        EXPECT_EQ(DecryptText(stored), plain);
        EXPECT_EQ(DecryptText(stored.toUpper()), plain);
        EXPECT_EQ(DecryptText(stored + u"00112233445566"_s), plain);
    }
    for (const QString& pair : {u"zz"_s, u"a "_s, u"\ta"_s, u"+a"_s})
        EXPECT_THROW(DecryptText(pair + u"00112233445566"_s), RuntimeError) << pair;
}

#include "app/DemoShop.h"
#include "app/Profile.h"
#include "app/QuoteDatabase.h"
#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "messages/Summary.h"
#include "outbound/SendQuote.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/settings/registry.h"
#include "quotedata/QuoteTotals.h"
#include "shell/SharedVariables.h"
#include "shell/eKEST.h"
#include "support/MariaDbServer.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QMap>

#include <gtest/gtest.h>

#include <optional>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

const QDate today(2008, 3, 21);

enum class EngineOf { Profile, Server };

/// The demo shop in the embedded database of its profile, and the same shop on a server.
class DemoShop : public ::testing::TestWithParam<EngineOf> {
protected:
    DemoShop()
    {
        EXPECT_TRUE(app::initProfile(true, today));
        if (GetParam() == EngineOf::Server)
            moveToServer();
        host.emplace();
    }

    static void moveToServer()
    {
        mariaDb().createDatabase(u"shop"_s);
        db::Connection database;
        database.open(mariaDb().connectionText(u"shop"_s));
        app::createTables(database, app::Dialect::MariaDb);
        app::fillNewShop(database);
        app::fillDemoShop(database, today);
        const std::pair<QString, QString> places[] = {{u"ServerName"_s, u"mysql:127.0.0.1:%1"_s.arg(mariaDb().port())},
                                                      {u"DatabaseName"_s, u"shop"_s}};
        for (const auto& [name, value] : places)
            EXPECT_TRUE(settings::setValue(settings::Hive::LocalMachine, u"SOFTWARE\\wirra32\\frmsplash"_s, name,
                                           {settings::Type::Text, value}));
    }

    /// The first column of each row as text.
    static QStringList texts(const QString& select)
    {
        QStringList found;
        for (db::Recordset rows = Opened(select); !rows.eof(); rows.moveNext())
            found << rows.text(rows.columns().first());
        return found;
    }

    TestProfile profile;
    ScriptedDesktop desktop{R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
    std::optional<eKEST> host;
};

QMap<QString, MessageRow> listed(int folder)
{
    QMap<QString, MessageRow> rows;
    for (const ListedMessage& message : BuildMessageList(folder, {LoadSubmissionResponse, {}, {}}))
        rows[message.file] = message.row;
    return rows;
}

}  // namespace

TEST_P(DemoShop, HoldsTogether)
{
    const char* faults[] = {
        "QUOTE1 WHERE NOT EXISTS (SELECT 1 FROM QUOTE3 t WHERE t.QTNNO=QUOTE1.QTNNO AND t.Subquote=QUOTE1.Subquote)",
        "QUOTE1 WHERE NOT EXISTS (SELECT 1 FROM QUOTE2 t WHERE t.QTNNO=QUOTE1.QTNNO AND t.Subquote=QUOTE1.Subquote)",
        "QUOTE1 WHERE INSURER_ID NOT IN (SELECT INSURER_ID FROM INSURER)",
        "QUOTE1 WHERE REGO NOT IN (SELECT REGO FROM CAR)",
        "QUOTE1 WHERE Job_stage NOT IN (SELECT stage FROM JOBSTAGE)",
        "QUOTE1 WHERE Subquote>0 AND QTNNO NOT IN (SELECT QTNNO FROM QUOTE1 WHERE Subquote=0)",
        "QUOTE1 WHERE QTNNO=(SELECT QUOTE_VAL FROM CINFO)",  // the next number that the shop gives is free
        "QUOTE2 WHERE VENDOR>0 AND VENDOR NOT IN (SELECT VENDOR_ID FROM VENDOR)",
        "CAR WHERE CUST_ID NOT IN (SELECT CUST_ID FROM CUSTOMER)",
        "CAR WHERE MODEL_ID NOT IN (SELECT MODEL_ID FROM ALLMODEL)",
        "CAR WHERE COLOUR NOT IN (SELECT Script FROM KESTColours)"};
    for (const char* fault : faults)
        EXPECT_EQ(texts(u"SELECT * FROM "_s + QLatin1StringView(fault)), QStringList()) << fault;
    EXPECT_EQ(texts(u"SELECT QTNNO FROM QUOTE1"_s).size(), 30);
    EXPECT_EQ(texts(u"SELECT remarks FROM QUOTE3 WHERE QTNNO='1003'"_s),
              QStringList(u"(15/03/2008 : Active Quote Request)"_s));
    EXPECT_EQ(texts(u"SELECT qtndate FROM QUOTE1 WHERE QTNNO='1003'"_s), QStringList(u"15/03/2008"_s));
}

TEST_P(DemoShop, ItsTotalsAreThoseOfItsLines)
{
    const char* columns[] = {"RR_TOTAL", "RA_TOTAL", "PAINT_TOTAL", "TOTAL", "PRTTOTAL", "MISTOTAL"};
    db::Recordset quote = Opened(u"SELECT * FROM QUOTE1"_s);
    for (; !quote.eof(); quote.moveNext()) {
        QStringList stored;
        QStringList calculated;
        for (const char* column : columns)
            stored << quote.text(QString::fromLatin1(column));
        db::Recordset lines = Opened(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND Subquote={}",
                                         quote.value(u"QTNNO"_s), quote.value(u"Subquote"_s)));
        CalcQuoteTotals(quote, lines);
        for (const char* column : columns)
            calculated << quote.text(QString::fromLatin1(column));
        EXPECT_EQ(stored, calculated) << quote.text(u"QTNNO"_s).toStdString();
    }
}

TEST_P(DemoShop, ListsItsMessages)
{
    const QMap<QString, MessageRow> unread = listed(Unread);
    QStringList shownTypes;
    for (auto message = unread.begin(); message != unread.end(); ++message) {
        shownTypes << message.key().section(u'_', 0, 0);
        const QString quote = message.value()[4];
        if (message.key().startsWith(u"QREQ"_s) || message.key().startsWith(u"EWAP"_s))
            continue;
        const QString named = message.key().section(u'_', 1).chopped(4).replace(u'_', u'/');
        EXPECT_EQ(quote, named) << message.key().toStdString();
    }
    shownTypes.removeDuplicates();
    EXPECT_EQ(shownTypes.join(u' '), u"ADQT ARES AUQT BACA BCQR EWAP MANQ MDMSG QMQR QRCN QREQ QTDL RRQT"_s);
    EXPECT_EQ(desktop.boxTexts(),
              QStringList(u"Message QREQ_20554_1.xml unreadable, Please contact MarlinDesk Support."_s));
    EXPECT_EQ(unread.keys().filter(u"QREQ"_s), QStringList({u"QREQ_20551_1.xml"_s, u"QREQ_20552_1.xml"_s}))
        << "one waits behind another of its request, one for its picture";
    EXPECT_EQ(texts(u"SELECT KESTQuoteNo FROM QUOTE1 WHERE QTNNO='1006'"_s), QStringList(u"300106"_s))
        << "the response to a send is taken in by the fill";

    const QMap<QString, MessageRow> sent = listed(Sent);
    EXPECT_EQ(sent.size(), 7);
    for (auto message = sent.begin(); message != sent.end(); ++message)
        EXPECT_TRUE(message.key().startsWith(QString(message.value()[4]).replace(u'/', u'.')))
            << message.key().toStdString();
    EXPECT_EQ(listed(Read).size(), files::list(gsReadPath).size());
}

TEST_P(DemoShop, ItsMessagesLoad)
{
    QStringList left;
    for (const QString& file : listed(Unread).keys()) {
        QString text = files::read(gsUnreadPath + file);
        if (LoadXML(text, file))
            MoveMessage(file, u"read"_s);
        else
            left << file;
    }
    EXPECT_EQ(left, QStringList(u"MDMSG_1009.xml"_s)) << desktop.boxTexts().join(u'\n').toStdString();
    EXPECT_EQ(listed(Unread).keys(), QStringList(u"QREQ_20551_2.xml"_s)) << "it waited behind the first of its request";
    EXPECT_EQ(files::list(gsImagesPath, u"1029_*.jpg"_s).size(), 3);
}

TEST_P(DemoShop, SendsWhatMayGo)
{
    const std::pair<QString, QString> quotes[] = {
        {u"1001"_s, u"Quote Sent."_s},
        {u"1004"_s, u"Quote Sent."_s},
        {u"1005"_s,
         u"Items with a Quantity of 0 cannot be sent to ORLA. Please check the quote details and try again."_s},
        {u"1011"_s, u"This quote request has been cancelled, Quote cannot be sent."_s},
        {u"1028"_s, u"This quote has already been sent via TIDE, you cannot use KEST to send this quote."_s}};
    for (const auto& [number, box] : quotes) {
        ASSERT_TRUE(OpenHostQuote(number, u"0"_s));
        SendQuote(*grsQuote);
        EXPECT_EQ(desktop.boxTexts().last(), box) << number.toStdString();
    }
    EXPECT_EQ(files::list(gsUnsentPath), QStringList({u"1001.0_1.xml"_s, u"1004.0_1.xml"_s}));
}

INSTANTIATE_TEST_SUITE_P(Engines, DemoShop, ::testing::Values(EngineOf::Profile, EngineOf::Server),
                         [](const auto& engine) {
                             return std::string(engine.param == EngineOf::Profile ? "Embedded" : "MariaDb");
                         });

}  // namespace kest::test

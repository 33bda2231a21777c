#include "app/Profile.h"
#include "inbound/modLoadXML.h"
#include "messages/Summary.h"
#include "platform/database/Sql.h"
#include "quotedata/QuoteTotals.h"
#include "shell/eKEST.h"
#include "shell/modDBAccess.h"
#include "support/Cases.h"
#include "support/Load.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <gtest/gtest.h>

#include <optional>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

class DemoShop : public ::testing::Test {
protected:
    DemoShop()
    {
        app::initProfile(true, QDate(2008, 3, 21));
        host.emplace();
    }

    /// The files of the unread list, filled as the window does.
    static QStringList listed()
    {
        QStringList names;
        for (const ListedMessage& message : BuildMessageList(Unread, {LoadSubmissionResponse, {}, {}}))
            names << message.file;
        return names;
    }

    static QString totals(const db::Recordset& quote)
    {
        QStringList texts;
        for (const char* column : {"RR_TOTAL", "RA_TOTAL", "PAINT_TOTAL", "TOTAL", "PRTTOTAL", "MISTOTAL"})
            texts << quote.text(QString::fromLatin1(column));
        return texts.join(u' ');
    }

    TestProfile profile;
    ScriptedDesktop desktop{R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
    std::optional<eKEST> host;
};

}  // namespace

TEST_F(DemoShop, HoldsTogether)
{
    for (const QString& rows : linesOf("app/demo-faults.txt"))
        EXPECT_TRUE(Opened(u"SELECT * FROM "_s + rows).eof()) << rows.toStdString();
    int count = 0;
    for (db::Recordset quote = Opened(u"SELECT * FROM QUOTE1"_s); !quote.eof(); quote.moveNext(), ++count) {
        const QString stored = totals(quote);
        db::Recordset lines = Opened(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND Subquote={}",
                                         quote.value(u"QTNNO"_s), quote.value(u"Subquote"_s)));
        CalcQuoteTotals(quote, lines);
        EXPECT_EQ(stored, totals(quote)) << quote.text(u"QTNNO"_s).toStdString();
    }
    EXPECT_EQ(count, 30);
}

TEST_F(DemoShop, ItsMessagesAreListedAndLoad)
{
    const QStringList names = listed();
    EXPECT_EQ(names.size(), 15) << names.join(u' ').toStdString();
    EXPECT_EQ(desktop.boxTexts(),
              QStringList(u"Message QREQ_20554_1.xml unreadable, Please contact MarlinDesk Support."_s));
    for (const QString& file : names)
        EXPECT_EQ(loadAsTheWindow(file), file != u"MDMSG_1009.xml"_s) << file.toStdString();
    EXPECT_EQ(listed(), QStringList(u"QREQ_20551_2.xml"_s)) << "it waited behind the first of its request";
}

}  // namespace kest::test

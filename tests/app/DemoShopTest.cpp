#include "app/Profile.h"
#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "messages/Summary.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "quotedata/QuoteTotals.h"
#include "shell/SharedVariables.h"
#include "shell/eKEST.h"
#include "shell/modDBAccess.h"
#include "support/Cases.h"
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

    TestProfile profile;
    ScriptedDesktop desktop{R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
    std::optional<eKEST> host;
};

}  // namespace

TEST_F(DemoShop, HoldsTogether)
{
    for (const QString& rows : linesOf("app/demo-faults.txt"))
        EXPECT_TRUE(Opened(u"SELECT * FROM "_s + rows).eof()) << rows.toStdString();
    EXPECT_EQ(Opened(u"SELECT remarks FROM QUOTE3 WHERE QTNNO='1003'"_s).text(u"remarks"_s),
              u"(15/03/2008 : Active Quote Request)"_s);

    db::Recordset quote = Opened(u"SELECT * FROM QUOTE1"_s);
    EXPECT_EQ(quote.recordCount(), 30);
    const auto totals = [&] {
        QStringList texts;
        for (const char* column : {"RR_TOTAL", "RA_TOTAL", "PAINT_TOTAL", "TOTAL", "PRTTOTAL", "MISTOTAL"})
            texts << quote.text(QString::fromLatin1(column));
        return texts;
    };
    for (; !quote.eof(); quote.moveNext()) {
        const QStringList stored = totals();
        db::Recordset lines = Opened(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND Subquote={}",
                                         quote.value(u"QTNNO"_s), quote.value(u"Subquote"_s)));
        CalcQuoteTotals(quote, lines);
        EXPECT_EQ(stored, totals()) << quote.text(u"QTNNO"_s).toStdString();
    }
}

TEST_F(DemoShop, ItsMessagesAreListedAndLoad)
{
    const QStringList names = listed();
    QStringList types;
    for (const QString& file : names)
        types << file.section(u'_', 0, 0);
    types.removeDuplicates();
    EXPECT_EQ(types.join(u' '), u"ADQT ARES AUQT BACA BCQR EWAP MANQ MDMSG QMQR QRCN QREQ QTDL RRQT"_s);
    EXPECT_EQ(desktop.boxTexts(),
              QStringList(u"Message QREQ_20554_1.xml unreadable, Please contact MarlinDesk Support."_s));
    EXPECT_EQ(names.filter(u"QREQ"_s).join(u' '), u"QREQ_20551_1.xml QREQ_20552_1.xml"_s)
        << "one waits behind another of its request, one for its picture";

    for (const QString& file : names) {
        QString text = files::read(gsUnreadPath + file);
        if (LoadXML(text, file))
            MoveMessage(file, u"read"_s);
        else
            EXPECT_EQ(file, u"MDMSG_1009.xml"_s) << desktop.boxTexts().join(u'\n').toStdString();
    }
    EXPECT_EQ(listed(), QStringList(u"QREQ_20551_2.xml"_s)) << "it waited behind the first of its request";
}

}  // namespace kest::test

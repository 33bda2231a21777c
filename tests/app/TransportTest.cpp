#include "app/Profile.h"
#include "app/transport/Transport.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "messages/Summary.h"
#include "outbound/SendQuote.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "shell/SharedVariables.h"
#include "shell/eKEST.h"
#include "support/Failure.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QFile>

#include <gtest/gtest.h>

#include <optional>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

const QDate today(2008, 3, 21);

/// The demo shop with an empty unread folder, and the transport beside it.
class Loopback : public ::testing::Test {
protected:
    Loopback()
    {
        app::initProfile(true, today);
        host.emplace();
        for (const QString& file : files::list(gsUnreadPath))
            files::remove(gsUnreadPath + file);
        rules({});
        restart();
    }

    void restart() { transport.emplace(folders()); }
    static app::TransportFolders folders()
    {
        return {gsUnreadPath, gsUnsentPath, gsSentPath, profile::componentFolder() + u'/'};
    }
    void rules(const QString& text) { files::write(folders().own + app::Transport::rulesName, text); }

    /// What was carried, as "out file" and "in file"; faults fail the test.
    QStringList carried()
    {
        const app::Carry carry = transport->carry(today);
        EXPECT_EQ(carry.faults, QStringList());
        QStringList lines;
        for (const app::Carried& file : carry.carried)
            lines << (file.direction == app::Carried::Out ? u"out "_s : u"in "_s) + file.file;
        return lines;
    }
    QStringList faults() { return transport->carry(today).faults; }

    static bool send(const QString& quote, const QString& subquote = u"0"_s)
    {
        bool sent = false;
        if (OpenHostQuote(quote, subquote))
            SendQuote(*grsQuote, &sent);
        return sent;
    }
    /// The list fill, which applies the answers; the files that it lists.
    static QStringList listed()
    {
        QStringList files;
        for (const ListedMessage& message : BuildMessageList(Unread, {LoadSubmissionResponse, {}, {}}))
            files << message.file;
        return files;
    }
    /// Loads the one message that is listed, and gives its type.
    QString loadOne()
    {
        const QStringList files = listed();
        EXPECT_EQ(files.size(), 1) << files.join(u' ').toStdString();
        if (files.isEmpty())
            return {};
        QString text = files::read(gsUnreadPath + files[0]);
        EXPECT_TRUE(LoadXML(text, files[0])) << desktop.boxTexts().join(u'\n').toStdString();
        MoveMessage(files[0], u"read"_s);
        return files[0].section(u'_', 2, 2);
    }
    /// Sends the quote, lets it be answered and taken in, and loads what comes then.
    void sendAndLoad(const QString& quote)
    {
        ASSERT_TRUE(send(quote));
        carried();
        listed();
        carried();
        loadOne();
    }

    static db::Recordset row(const QString& quote, const QString& subquote = u"0"_s, const QString& table = u"QUOTE1"_s)
    {
        return Opened(u"SELECT * FROM %1 WHERE QTNNO='%2' AND Subquote=%3"_s.arg(table, quote, subquote));
    }
    /// "stage lock" of the quote, and the notes that the chain holds.
    static QString stateOf(const QString& quote, const QString& subquote = u"0"_s)
    {
        const db::Recordset header = row(quote, subquote);
        return header.eof()
                   ? u"gone"_s
                   : header.text(u"Job_stage"_s) + (isTrue(header.value(u"ReadOnly"_s)) ? u" locked"_s : u" open"_s);
    }
    static QString notesOf(const QString& quote, const QString& subquote = u"0"_s)
    {
        return row(quote, subquote, u"QUOTE3"_s).text(u"remarks"_s);
    }

    TestProfile profile;
    ScriptedDesktop desktop{R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
    std::optional<eKEST> host;
    std::optional<app::Transport> transport;
};

}  // namespace

TEST_F(Loopback, ASentQuoteIsCarriedAndAnswered)
{
    ASSERT_TRUE(send(u"1004"_s));
    const QString document = files::read(gsUnsentPath + u"1004.0_1.xml"_s);
    EXPECT_EQ(carried(), QStringList({u"out 1004.0_1.xml"_s, u"in R_1004_0_600002.xml"_s}));
    EXPECT_EQ(files::list(gsUnsentPath), QStringList());
    EXPECT_EQ(files::read(gsSentPath + u"1004.0_1.xml"_s), document);

    EXPECT_EQ(listed(), QStringList());
    EXPECT_EQ(row(u"1004"_s).text(u"KESTQuoteNo"_s), u"600002"_s);
    EXPECT_EQ(GetNoteStatus(u"KEST Quote"_s, notesOf(u"1004"_s)), u"Submitted"_s);
    EXPECT_EQ(carried(), QStringList()) << "a second carry has nothing to do";
}

TEST_F(Loopback, EachMessageHasTheEffectThatItsTypeTells)
{
    struct Case {
        QString step;
        QString code;
        QString state;
        QString note;
    };
    const Case cases[] = {
        {u"adjust change=1"_s, u"ADQT"_s, u"3 locked"_s, u": Adjustment Suggested)"_s},
        {u"authorise change=2 add=1 delete=1 sublet=1"_s, u"AUQT"_s, u"4 locked"_s, u": Won Quote Request)"_s},
        {u"back-out"_s, u"BACA"_s, u"3 locked"_s, u": Deleted Authorised Quote)"_s},
        {u"revise reason=again"_s, u"RRQT"_s, u"1 open"_s, u": Quote Revision Requested \"Reason : again\")"_s},
        {u"delete reason=twice"_s, u"QTDL"_s, u"1 open"_s, u": Quote Deleted \"Reason : twice\")"_s},
        {u"cancel reason=sold"_s, u"QRCN"_s, u"9 locked"_s, u": QR Cancelled - sold)"_s},
        {u"reinstate"_s, u"BCQR"_s, u"1 open"_s, u": QR Reinstated)"_s},
        {u"reject reason=TLSS"_s, u"ARES"_s, u"10 locked"_s, u": Total Loss Quote Request)"_s},
        {u"back-out wait=0"_s, u"BACA"_s, u"3 locked"_s, u": Fail Tender Backout)"_s},
        {u"waive"_s, u"EWAP"_s, u"3 locked"_s, u": ORLA Waived Excess)"_s},
        {u"match request=20504"_s, u"QMQR"_s, u"3 locked"_s, u": Matched Quote Request)"_s},
        {u"manual"_s, u"MANQ"_s, u"3 locked"_s, u": Manual Quote Loaded)"_s},
    };
    ASSERT_TRUE(send(u"1004"_s));
    carried();
    const QString answer = files::list(gsUnreadPath).value(0);
    const QString text = files::read(gsUnreadPath + answer);
    for (const Case& c : cases) {
        files::write(gsUnreadPath + answer, text);
        listed();
        rules(u"on start quote=1004 claim=7701004\n  "_s + c.step);
        carried();
        EXPECT_EQ(loadOne(), c.code);
        listed();  // an old answer would lock the quote again
        EXPECT_EQ(stateOf(u"1004"_s), c.state) << c.code.toStdString();
        EXPECT_TRUE(notesOf(u"1004"_s).contains(c.note)) << notesOf(u"1004"_s).toStdString();
    }
}

}  // namespace kest::test

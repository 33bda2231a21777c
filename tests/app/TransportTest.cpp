#include "app/Profile.h"
#include "app/transport/Transport.h"
#include "app/transport/TransportCommand.h"
#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "messages/Summary.h"
#include "outbound/SendQuote.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "shell/SharedVariables.h"
#include "shell/eKEST.h"
#include "support/Messages.h"
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
        EXPECT_TRUE(LoadXML(text, files[0])) << desktop->boxTexts().join(u'\n').toStdString();
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
    std::optional<ScriptedDesktop> desktop{std::in_place, R"({"boxes":[{"text":"DELETED","answer":"yes"}]})"};
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
    EXPECT_EQ(desktop->boxes().filter(u"critical|"_s), QStringList());
}

TEST_F(Loopback, ARequestComesBehindItsPictures)
{
    rules(u"on start\n  request number=20777 rego=NEW777 pictures=2 claim=7720777\n"_s);
    EXPECT_EQ(carried(), QStringList({u"in 20777_001.jpg"_s, u"in 20777_001.txt"_s, u"in 20777_002.jpg"_s,
                                      u"in 20777_002.txt"_s, u"in WEB_000001_QREQ_20777.xml"_s}));
    EXPECT_EQ(loadOne(), u"QREQ"_s);
    EXPECT_EQ(files::list(gsUnreadPath), QStringList());
    EXPECT_EQ(files::list(gsImagesPath, u"1029_*.jpg"_s).size(), 2);
    const db::Recordset quote = Opened(u"SELECT * FROM QUOTE1 WHERE KESTQRNo='20777'"_s);
    EXPECT_EQ(quote.text(u"REGO"_s) + u' ' + quote.text(u"Claim"_s), u"NEW777 7720777"_s);
}

TEST_F(Loopback, AnAuthorisationChangesAddsAndDeletesLinesOfTheQuoteThatWasSent)
{
    rules(u"on quote 1004 claim=7701004\n  authorise change=2 add=3 delete=1 sublet=1 excess=150\n"_s);
    ASSERT_TRUE(send(u"1004"_s));
    const auto amounts = [] {
        QMap<QString, QString> lines;
        db::Recordset line = row(u"1004"_s, u"0"_s, u"QUOTE2"_s);
        for (; !line.eof(); line.moveNext())
            lines[line.text(u"SEQ_NO"_s)] = QStringList({line.text(u"rrhour"_s), line.text(u"rahour"_s),
                                                         line.text(u"pthour"_s), line.text(u"unitcost"_s)})
                                                .join(u' ');
        return lines;
    };
    const int before = int(amounts().size());
    carried();
    listed();
    carried();
    EXPECT_EQ(loadOne(), u"AUQT"_s);

    const QMap<QString, QString> after = amounts();
    EXPECT_EQ(after.size(), before - 1 + 3 + 1);
    for (const QString& added : {u"101"_s, u"102"_s, u"103"_s, u"104"_s})
        EXPECT_TRUE(after.contains(added)) << added.toStdString();
    EXPECT_EQ(files::list(folders().unread + u"../PDF"_s), QStringList(u"1004.0_104.pdf"_s));
    EXPECT_TRUE(files::readBytes(folders().unread + u"../PDF/1004.0_104.pdf"_s).startsWith("%PDF-1.4"));
    const db::Recordset quote = row(u"1004"_s);
    EXPECT_EQ(quote.text(u"KESTAuthNo"_s) + u' ' + quote.text(u"Claim"_s), u"600003 7701004"_s);
    QStringList actions;
    for (const QJsonValue& window : desktop->record().windows)
        for (const QJsonValue& line : window[u"table"][u"rows"].toArray())
            actions << line[12].toString();
    actions.sort();
    EXPECT_EQ(actions.join(QString()), u"CCDIIII"_s) << "the comparison shows what the insurer did";
}

TEST_F(Loopback, AStepWaitsUntilTheShopHasDealtWithTheOneBefore)
{
    rules(u"on start\n  request number=20777\n  cancel\n  reinstate wait=1\n"_s);
    EXPECT_EQ(carried(), QStringList(u"in WEB_000001_QREQ_20777.xml"_s));
    EXPECT_EQ(carried(), QStringList());
    EXPECT_EQ(loadOne(), u"QREQ"_s);
    EXPECT_EQ(carried(), QStringList(u"in WEB_000002_QRCN_20777.xml"_s));
    files::remove(gsUnreadPath + u"WEB_000002_QRCN_20777.xml"_s);
    EXPECT_EQ(carried(), QStringList()) << "it waits one carry longer";
    EXPECT_EQ(carried(), QStringList(u"in WEB_000003_BCQR_20777.xml"_s));
    EXPECT_EQ(carried(), QStringList());
}

TEST_F(Loopback, AQuoteSentAgainFollowsItsNextRuleAndHasOneAnswer)
{
    rules(u"on quote 1004\n  revise\n  adjust\non quote 1004\n  adjust\n"_s);
    sendAndLoad(u"1004"_s);
    EXPECT_EQ(row(u"1004"_s).text(u"KESTQRVer"_s), u"2"_s);
    EXPECT_EQ(files::list(gsUnreadPath), QStringList());
    ASSERT_TRUE(send(u"1004"_s));
    EXPECT_EQ(carried(), QStringList({u"out 1004.0_2.xml"_s, u"in R_1004_0_600003.xml"_s}));
    EXPECT_EQ(carried(), QStringList(u"in WEB_000002_ADQT_1004.xml"_s)) << "what the first rule had left is over";
    EXPECT_EQ(loadOne(), u"ADQT"_s);
    EXPECT_EQ(row(u"1004"_s).text(u"KESTQuoteNo"_s), u"600003"_s);
}

TEST_F(Loopback, ARejectedAdditionalIsNotLockedAgainByItsAnswer)
{
    rules(u"on quote */* request=20520 claim=7701020\n  adjust\n  reject reason=PART\n"_s);
    files::write(gsUnsentPath + u"1020.1_1.xml"_s, sentDocument("1020/1"));
    EXPECT_EQ(carried(), QStringList({u"out 1020.1_1.xml"_s, u"in R_1020_1_600002.xml"_s}));
    listed();
    EXPECT_EQ(stateOf(u"1020"_s, u"1"_s), u"1 locked"_s);
    carried();
    EXPECT_EQ(loadOne(), u"ADQT"_s);
    EXPECT_EQ(carried(), QStringList(u"in WEB_000002_ARES_1020.1.xml"_s));
    EXPECT_EQ(loadOne(), u"ARES"_s);
    listed();
    EXPECT_EQ(stateOf(u"1020"_s, u"1"_s), u"1 open"_s);
    EXPECT_EQ(stateOf(u"1020"_s), u"4 locked"_s);
}

TEST_F(Loopback, AMarkerAndAManualQuoteTakeTheirOwnWays)
{
    rules(u"on start\n  marker quote=1009 text=\"Sent twice\"\n"_s);
    EXPECT_EQ(carried(), QStringList(u"in WEB_000001_MDMSG_1009.xml"_s));
    QString text = files::read(gsUnreadPath + listed().value(0));
    EXPECT_FALSE(LoadXML(text, u"WEB_000001_MDMSG_1009.xml"_s));
    EXPECT_EQ(desktop->boxTexts().last(), u"Sent twice"_s);
    files::waitForBackground(5000);

    rules(
        u"on start\n  request number=20519 rego=ZBN42K\non start\n"
        "  manual quote=1019 request=20519 rego=ZBN42K labour=3 parts=2 paint=1 sublet=1\n"_s);
    carried();
    EXPECT_EQ(loadOne(), u"MANQ"_s) << "it takes the place of the request that waits";
    EXPECT_EQ(files::list(gsUnreadPath), QStringList());
    EXPECT_EQ(row(u"1019"_s, u"0"_s, u"QUOTE2"_s).recordCount(), 7);
}

TEST_F(Loopback, APictureAndItsDocumentGoTogether)
{
    const QString document = u"<request><kestQuoteNumber>1004/0</kestQuoteNumber></request>"_s;
    files::write(gsUnsentPath + u"I_1004_0001.xml"_s, document);
    files::write(gsUnsentPath + u"I_1004_0002.jpg"_s, u"picture"_s);
    EXPECT_EQ(carried(), QStringList());
    files::write(gsUnsentPath + u"I_1004_0001.JPG"_s, u"picture"_s);
    files::write(gsSentPath + u"I_1004_0001.jpg"_s, u"of an earlier send"_s);
    EXPECT_EQ(carried(), QStringList({u"out I_1004_0001.JPG"_s, u"out I_1004_0001.xml"_s}));
    EXPECT_EQ(files::read(gsSentPath + u"I_1004_0001.jpg"_s), u"picture"_s);
    EXPECT_EQ(files::list(gsUnsentPath), QStringList(u"I_1004_0002.jpg"_s));
}

TEST_F(Loopback, WhatCannotBeSentStaysAndIsToldOnceForEachChange)
{
    const auto withReference = [](const QString& reference) {
        return u"<quoteBody><quoteReference>"_s + reference + u"</quoteReference></quoteBody>"_s;
    };
    const QString texts[] = {u"<quoteBody>"_s,
                             {},
                             u"\u0001\u00ff&"_s,
                             withReference({}),
                             withReference(u"1004/12"_s),
                             withReference(u"../1004/0"_s),
                             withReference(u"10_04/0"_s),
                             u"<!DOCTYPE x []><quoteBody/>"_s};
    for (const QString& text : texts) {
        files::write(gsUnsentPath + u"odd.xml"_s, text);
        EXPECT_EQ(faults().size(), 1) << text.toStdString();
        EXPECT_EQ(faults().size(), 0) << text.toStdString();
        EXPECT_EQ(files::read(gsUnsentPath + u"odd.xml"_s), text);
    }
    files::write(gsUnsentPath + u"I_odd.xml"_s, u"<request>"_s);
    files::write(gsUnsentPath + u"I_odd.jpg"_s, {});
    EXPECT_EQ(faults().size(), 1);
    files::remove(gsUnsentPath + u"I_odd.xml"_s);

    ASSERT_TRUE(send(u"1004"_s));
    files::write(gsSentPath + u"1004.0_1.xml"_s, u"another"_s);
    EXPECT_EQ(faults(), QStringList(u"1004.0_1.xml: a document of this name was sent already"_s));
    EXPECT_EQ(files::read(gsSentPath + u"1004.0_1.xml"_s), u"another"_s);
    EXPECT_EQ(files::list(gsUnreadPath), QStringList());
}

TEST_F(Loopback, WhatFailedIsDoneAgainWithTheSameNumbers)
{
    const auto allow = [](const QString& folder, bool allowed) {
        const QFile::Permissions read = QFile::ReadOwner | QFile::ExeOwner;
        ASSERT_TRUE(QFile::setPermissions(files::systemPath(folder), allowed ? read | QFile::WriteOwner : read));
    };
    ASSERT_TRUE(send(u"1004"_s));
    allow(gsSentPath, false);
    EXPECT_EQ(faults().size(), 1);
    restart();
    EXPECT_EQ(faults().size(), 1);
    EXPECT_EQ(files::list(gsUnsentPath), QStringList(u"1004.0_1.xml"_s));
    EXPECT_EQ(files::list(gsUnreadPath), QStringList()) << "no answer to a quote that has not gone";
    allow(gsSentPath, true);
    allow(gsUnreadPath, false);
    EXPECT_EQ(faults().size(), 1);
    restart();
    EXPECT_EQ(faults().size(), 1);
    allow(gsUnreadPath, true);
    EXPECT_EQ(carried(), QStringList(u"in R_1004_0_600002.xml"_s));
}

TEST_F(Loopback, RulesWithAFaultStopEverythingUntilTheyAreMended)
{
    rules(u"on quote 1004\n  nothing\n"_s);
    ASSERT_TRUE(send(u"1004"_s));
    EXPECT_EQ(faults().filter(u"insurer.rules: line 2: "_s).size(), 1);
    EXPECT_EQ(faults(), QStringList());
    EXPECT_EQ(files::list(gsUnsentPath).size(), 1);
    rules(u"on quote 1004\n  authorise\n  waive\n"_s);
    carried();
    EXPECT_EQ(
        faults(),
        QStringList(u"insurer.rules, line 1, quote 1004, authorise: the claim is not known; say it with claim="_s));
    EXPECT_EQ(faults(), QStringList());
}

TEST_F(Loopback, TheSameSeedSendsTheSameWhateverComesBetween)
{
    const QString story =
        u"seed 20551\non start\n  request pictures=1\non quote 1004 claim=1\n"
        "  adjust change=2 add=2\n  authorise change=1 sublet=1\n"_s;
    ASSERT_TRUE(send(u"1004"_s));
    const QByteArray document = files::readBytes(gsUnsentPath + u"1004.0_1.xml"_s);
    const auto run = [&](const QString& text, bool restarting) {
        QMap<QString, QByteArray> sent;
        rules(text);
        files::writeBytes(gsUnsentPath + u"1004.0_1.xml"_s, document);
        for (int i = 0; i < 5; ++i) {
            if (restarting || i == 0)
                restart();
            for (const QString& file : carried())
                if (file.startsWith(u"in "_s))
                    sent[file] = files::readBytes(gsUnreadPath + file.sliced(3));
            for (const QString& file : files::list(gsUnreadPath))
                files::remove(gsUnreadPath + file);
        }
        files::remove(gsSentPath + u"1004.0_1.xml"_s);
        files::remove(folders().own + app::Transport::stateName);
        return sent;
    };
    const auto once = run(story, false);
    EXPECT_EQ(once.size(), 6);
    EXPECT_EQ(run(story, true), once);
    EXPECT_NE(run(QString(story).replace(u"20551"_s, u"20552"_s), false), once);
}

TEST_F(Loopback, TheWindowShowsWhatIsCarriedAndASecondOneSaysSo)
{
    desktop.reset();
    desktop.emplace(R"({"windows":{"KESTWeb":[[{"click":"carryButton"}, {"read":["carriedList","status"]},
        {"key":"KESTWeb","keys":"Alt+L"}]]}})");
    ASSERT_TRUE(send(u"1004"_s));
    EXPECT_TRUE(app::runTransport(app::TransportMode::Window, {}));
    EXPECT_EQ(desktop->read(u"carriedList"_s, u"rows"_s)[0][2].toString(), u"1004.0_1.xml"_s);
    EXPECT_TRUE(desktop->read(u"status"_s).toString().endsWith(u"2 files carried so far."_s));

    app::TransportRunner first(folders(), [](const app::Carry&) {});
    ASSERT_TRUE(first.claim());
    EXPECT_FALSE(app::runTransport(app::TransportMode::Window, {}));
    EXPECT_EQ(desktop->boxTexts().last(), u"KESTWeb is running already."_s);
    EXPECT_FALSE(app::runTransport(app::TransportMode::Once, {}));
}

}  // namespace kest::test

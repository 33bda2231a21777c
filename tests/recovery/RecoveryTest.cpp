// Work that loses its connection at any statement ends, once it is settled and repeated, as if nothing had happened.
#include "base/History.h"
#include "base/Journal.h"
#include "inbound/modLoadXML.h"
#include "messagelist/frmMessageList.h"
#include "messages/Folders.h"
#include "outbound/Sending.h"
#include "platform/RuntimeError.h"
#include "recovery/Recovery.h"

#include <QLabel>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

struct Interrupted : Sending {
    Interrupted()
    {
        quote("500").request("QR1").quoteNumber("KQ1").stage(3).set("excess", 500).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        quote("500", 1).quoteNumber("KQ2").line(1);
        recovery::takeSettled();
    }
    ~Interrupted() override { db::setStatementFault({}); }

    /// Runs work whose connection is lost at that statement, and opens another one. Returns false if the work has fewer
    /// statements.
    template <class Work>
    static bool interrupt(int number, Work&& work)
    {
        int statement = 0;
        db::setStatementFault([&] { return ++statement == number; }, CannotOpen);
        attempt(work);
        db::setStatementFault({});
        EXPECT_TRUE(EnsureConnection());  // settles what it finds
        recovery::settle();
        return statement >= number;
    }

    static void loadIfItWaits()
    {
        const bool waits = files::exists(gsUnreadPath + u"m.xml"_s);
        EXPECT_TRUE(!waits || loadAsTheWindow(u"m.xml"_s));
    }

    /// All data, without the numbers of rows, which the database gives again only to the last.
    static std::string numberless()
    {
        static const QRegularExpression number(u"\\b(rec_id|CUST_ID|VENDOR|VENDOR_ID)=\\d+"_s);
        return QString::fromStdString(holdings()).replace(number, u"\\1=*"_s).toStdString();
    }

    /// Interrupts work at each of its statements and repeats it. All must be as after undisturbed work.
    template <class Work, class Again>
    void interruptEachStatement(Work&& work, Again&& again)
    {
        const Snapshot before;
        work();
        const std::string expected = numberless();
        for (int number = 1;; ++number) {
            before.restore();
            EnsureConnection();
            recovery::takeSettled();
            const bool isInterrupted = interrupt(number, work);
            for (const recovery::Settled& settled : recovery::takeSettled())
                outcomes.insert(recovery::wordOf(settled.outcome));
            again();
            EXPECT_EQ(difference(expected, numberless()), "\n") << "statement " << number;
            EXPECT_EQ(rowCount("KESTOperation", "State='open'"), 0) << "statement " << number;
            if (!isInterrupted)
                break;
        }
        before.restore();
        EnsureConnection();
    }

    QSet<QString> outcomes;
    const QSet<QString> both{u"taken back"_s, u"finished"_s};

    static Row newest() { return Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)"); }
};

/// Keeps the read folder from taking messages.
class ReadFolderAway {
public:
    ReadFolderAway() : path_(std::exchange(gsReadPath, u"c:\\gone\\"_s)) {}
    ~ReadFolderAway() { gsReadPath = path_; }
    Q_DISABLE_COPY_MOVE(ReadFolderAway)

private:
    QString path_;
};

}  // namespace

TEST_F(Interrupted, ALoadHappensOnce)
{
    desktop.emplace(R"({"boxes": [{"text": "want to continue", "answer": "yes"}]})");
    arrive("QR9_001.jpg", "picture");
    arrive("QR9_001.txt", "its text");
    const std::pair<Text, const char*> sublet("subletAuthorityDocument", "JVBERi0xLjQ=");
    for (const Message& message :
         {authorisedQuote("500")
              .set("excess", "400")
              .labour(1, "C")
              .part(2, "D")
              .paint(3, "I")
              .sublet(5, "I", {sublet}),
          manualQuote("500").labour(1, "I").part(2, "I"), quoteRequest("QR9").images({"1"}), cancellation("QR1"),
          cancellationBackout("QR1"), revisionRequest("QR1"), excessWaiver("500"), quoteMatch("500"),
          adjustedQuote("500"), assessmentResult("KQ1"), assessmentBackout("QR1"), quoteDeletion("KQ1"),
          quoteDeletion("KQ2")}) {
        arrive("m.xml", message);
        SCOPED_TRACE(message.text().left(60).toStdString());
        interruptEachStatement([] { loadAsTheWindow(u"m.xml"_s); }, loadIfItWaits);
    }
    EXPECT_EQ(outcomes, both);
}

TEST_F(Interrupted, AResponseHappensOnce)
{
    quote("500").note("Sending KEST Quote");
    arrive("R_500_0.xml", submissionResponse("KQ7"));
    interruptEachStatement([] { listed(); }, [] { listed(); });
    EXPECT_EQ(outcomes, both);
}

TEST_F(Interrupted, ASendHappensOnce)
{
    sendable("600").request("QR6").note("Active Quote Request");
    for (const char* picture : {"600_0001.jpg", "600_0002.jpg"})
        files::write(gsImagesPath + QString::fromLatin1(picture), u"picture"_s);
    interruptEachStatement([] { send("600"); },
                           [] {
                               if (!quote("600").locked())
                                   send("600");
                           });
    EXPECT_EQ(outcomes, both);
}

TEST_F(Interrupted, ASendIsNotFinishedOverItsAnswer)
{
    sendable("600");
    for (int number = 1; number < 100; ++number) {
        const bool isInterrupted = interrupt(number, [] { send("600"); });
        if (outgoing(u"600.0_1.xml"_s).isEmpty())
            continue;
        ASSERT_TRUE(isInterrupted);
        break;
    }
    // the same again, but the answer is there before anybody settles
    gConn->execute(u"UPDATE KESTOperation SET State='open', PastPoint=0 WHERE State='finished'"_s);
    quote("600").locked(false);
    quote("600").texts().set("remarks", QString(u"(01/02/2008 : Submitted KEST Quote)"_s));
    recovery::settle();
    EXPECT_EQ(quote("600").state(), "3 locked - (01/02/2008 : Submitted KEST Quote)");
}

TEST_F(Interrupted, TheUserIsToldWhatBecameOfIt)
{
    const auto operation = [](int id, const char* kind, const char* file, const char* quote, bool pastPoint) {
        gConn->execute(sql(
            "INSERT INTO KESTOperation (Operation, OperationKind, State, FileName, QTNNO, Subquote, LockName, "
            "StartedAt, PastPoint, Facts) VALUES ({}, '{}', 'open', '{}', '{}', '0', 'x', "
            "'2026-11-23T10:31:00', {}, '{}')",
            id, QString::fromLatin1(kind), QString::fromLatin1(file), QString::fromLatin1(quote), pastPoint, u"{}"_s));
    };
    operation(11, "load", "AUQT_1007.xml", "1007", false);
    operation(12, "load", "AUQT_1007.xml", "1007", true);
    operation(13, "send", "", "1007", false);
    operation(14, "save", "", "1007", false);
    operation(15, "response", "R_1_0.xml", "1", true);
    operation(16, "load", "m.xml", "500", false);
    gConn->execute(
        sql("INSERT INTO KESTJournal (Operation, TableName, Settled, RowData) VALUES (16, 'QUOTE1', 0, '{}')",
            uR"({"change":1,"columns":[["QTNNO",0,"777","777"],["Claim",0,"1","2"]],"key":["QTNNO"],)"
            R"("table":"QUOTE1"})"_s));
    recovery::settle();
    QStringList told;
    for (const recovery::Settled& settled : recovery::takeSettled())
        told += recovery::wordOf(settled.outcome) + u": "_s + settled.sentence();
    const QString at = u" was interrupted on 23/11/2026 at 10:31. "_s;
    EXPECT_EQ(told, (QStringList{
                        u"taken back: The load of AUQT_1007.xml"_s + at +
                            u"It has been taken back; load the message again."_s,
                        u"finished: The load of AUQT_1007.xml"_s + at + u"It has been finished."_s,
                        u"taken back: The send of quote 1007"_s + at + u"The quote was not sent; send it again."_s,
                        u"taken back: The save in the utilities"_s + at + u"It has been taken back."_s,
                        u"finished: The response R_1_0.xml"_s + at + u"It has been finished."_s,
                        u"left: The load of m.xml"_s + at +
                            u"Not all of it could be taken back; check the quote 500. The row of QUOTE1 with QTNNO 777 "
                            "was changed by someone else and stays as it is."_s,
                    }));
    recovery::settle();
    EXPECT_TRUE(recovery::takeSettled().isEmpty());
}

TEST_F(Interrupted, TheListTellsWhatWasSettledBesideItsMessages)
{
    arrive("m.xml", adjustedQuote("500"));
    EXPECT_TRUE(interrupt(16, [] { loadAsTheWindow(u"m.xml"_s); }));
    frmMessageList window;
    window.openUnread();
    const QString line = window.findChild<QLabel*>(u"lblStatus"_s)->text();
    EXPECT_TRUE(line.startsWith(u"The load of m.xml was interrupted"_s) && line.endsWith(u" No unread messages"_s))
        << line;
}

TEST_F(Interrupted, AReportThatNobodySawIsTold)
{
    putTemplate(710);
    arrive("m.xml", quoteRequest("QR9"));
    desktop.emplace(R"({"windows": {"frmPrintPreview": [[{"click": "nothing"}]]}})");  // ends the process there
    EXPECT_ANY_THROW(loadAsTheWindow(u"m.xml"_s));
    gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);
    recovery::settle();
    const QList<recovery::Settled> settled = recovery::takeSettled();
    ASSERT_EQ(settled.size(), 1);
    const QString number = settled[0].operation.number;
    EXPECT_EQ(settled[0].left,
              QStringList(u"Its report was not shown: reprint %1.xml from the read messages."_s.arg(number)));
    EXPECT_TRUE(files::exists(gsReadPath + number + u".xml"_s));
}

TEST_F(Interrupted, ALoadedMessageThatCouldNotBeMovedIsMovedLater)
{
    for (const bool byLoad : {false, true}) {
        arrive("m.xml", adjustedQuote("500"));
        frmMessageList window;
        std::string loaded;
        {
            const ReadFolderAway away;
            window.openUnread();
            EXPECT_TRUE(window.loadFile(u"m.xml"_s));
            loaded = quote("500").notes();
            EXPECT_TRUE(window.loadFile(u"m.xml"_s)) << "it is not loaded twice";
            EXPECT_EQ(newest().text("State"), "unfinished");
        }
        shown();
        if (byLoad) {
            EXPECT_TRUE(window.loadFile(u"m.xml"_s));
            EXPECT_EQ(shown(), "[none] Message Loaded");
        } else {
            window.RefreshList();
        }
        EXPECT_EQ(quote("500").notes(), loaded);
        EXPECT_EQ(newest().text("State"), "done");
        EXPECT_FALSE(files::exists(gsUnreadPath + u"m.xml"_s));
    }
    // a message that somebody puts back is a new one
    const std::string loaded = quote("500").notes();
    arrive("m.xml", adjustedQuote("500"));
    frmMessageList window;
    window.openUnread();
    EXPECT_TRUE(window.loadFile(u"m.xml"_s));
    EXPECT_NE(quote("500").notes(), loaded);
}

TEST_F(Interrupted, AMoveThatBeganEndsUnderItsName)
{
    arrive("m.xml", adjustedQuote("500"));
    {
        journal::Operation operation(journal::Kind::Load, u"m.xml"_s,
                                     journal::hashOf(files::read(gsUnreadPath + u"m.xml"_s)));
        QString text = files::read(gsUnreadPath + u"m.xml"_s);
        EXPECT_TRUE(LoadXML(text, u"m.xml"_s));
        journal::keep(u"newName"_s, u"500.0_1.xml"_s);
        files::copy(gsUnreadPath + u"m.xml"_s, gsReadPath + u"500.0_1.xml"_s);
        operation.end(journal::State::Unfinished);
    }
    recovery::settle();
    EXPECT_EQ(filesIn(gsReadPath), QStringList(u"500.0_1.xml"_s));
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
}

TEST_F(Interrupted, PicturesThatCouldNotBeSentAreSentLater)
{
    sendable("600");
    for (const char* picture : {"600_0001.jpg", "600_0002.jpg"})
        files::write(gsImagesPath + QString::fromLatin1(picture), u"picture"_s);
    files::makeFolder(gsUnsentPath + u"I_600_0002.jpg"_s);  // in the way of the copy
    attempt([] { send("600"); });
    EXPECT_EQ(newest().text("State"), "unfinished");
    QDir(files::systemPath(gsUnsentPath + u"I_600_0002.jpg"_s)).removeRecursively();
    files::remove(gsUnsentPath + u"I_600_0001.jpg"_s);  // the transport has taken it
    recovery::settle();
    EXPECT_EQ(filesIn(gsUnsentPath),
              (QStringList{u"600.0_1.xml"_s, u"I_600_0001.xml"_s, u"I_600_0002.jpg"_s, u"I_600_0002.xml"_s}));
    EXPECT_EQ(newest().text("State"), "done");
}

TEST_F(Interrupted, RecoveryMayBeInterruptedToo)
{
    arrive("m.xml", authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").paint(3, "I"));
    const Snapshot before;
    loadAsTheWindow(u"m.xml"_s);
    const std::string expected = numberless();
    for (const int lost : {14, 1000})  // before and after the point of no return
        for (int number = 1;; ++number) {
            before.restore();
            EnsureConnection();
            int statement = 0;
            const auto isLost = [&] {
                // after the point, the process dies before it can close the operation
                return ++statement >= lost;
            };
            db::setStatementFault(isLost, CannotOpen);
            attempt([] { loadAsTheWindow(u"m.xml"_s); });
            db::setStatementFault({});
            if (lost == 1000)
                gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);
            const bool isInterrupted = interrupt(number, [] {
                EnsureConnection();
                recovery::settle();
            });
            loadIfItWaits();
            EXPECT_EQ(difference(expected, numberless()), "\n") << "statement " << number;
            if (!isInterrupted)
                break;
        }
}

TEST_F(Interrupted, WorkOfALivingOwnerIsLeftAlone)
{
    journal::Operation operation(journal::Kind::Save);
    gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s);
    const QString lock = journal::entryOf(newest().id()).lock;
    operation.end(journal::State::Done);
    gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);

    const auto owner = std::make_shared<db::Connection>();
    owner->open(connectionText(driverNumber()));
    {
        const db::Lock alive(owner, lock);
        recovery::settle();
        EXPECT_EQ(quote("500").text("Claim"), "C9");
    }
    recovery::settle();
    EXPECT_NE(quote("500").text("Claim"), "C9");
}

TEST_F(Interrupted, AWindowThatLostItsSessionChangesNothingOnceOthersSettledItsWork)
{
    const auto owner = std::make_shared<db::Connection>();
    owner->open(connectionText(driverNumber()));
    for (const bool isSettled : {false, true}) {
        const std::string claim = quote("500").text("Claim");
        journal::Operation operation(journal::Kind::Save);
        gConn->execute(u"UPDATE QUOTE1 SET TOTAL=5 WHERE QTNNO='500'"_s);
        dropConnection();
        ASSERT_TRUE(EnsureConnection());
        std::unique_ptr<db::Lock> settling;
        if (isSettled)
            owner->execute(u"UPDATE KESTOperation SET State='taken back' WHERE State='open'"_s);
        else
            settling = std::make_unique<db::Lock>(owner, journal::entryOf(newest().id()).lock);
        EXPECT_EQ(failureOf([] { gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s); }), RowChanged);
        EXPECT_EQ(failureOf([] { journal::keep(u"newName"_s, u"x"_s); }), RowChanged);
        operation.end(journal::State::Done);
        EXPECT_EQ(quote("500").text("Claim"), claim);
        EXPECT_EQ(newest().text("State"), isSettled ? "taken back" : "open");
    }
}

TEST_F(Interrupted, AWindowThatLostItsSessionGoesOnIfNobodySettledItsWork)
{
    {
        journal::Operation operation(journal::Kind::Save);
        gConn->execute(u"UPDATE QUOTE1 SET TOTAL=5 WHERE QTNNO='500'"_s);
        dropConnection();
        ASSERT_TRUE(EnsureConnection());
        gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s);
        operation.end(journal::State::Done);
    }
    EXPECT_EQ(quote("500").text("Claim"), "C9");
    EXPECT_EQ(newest().text("State"), "done");
}

}  // namespace kest::test

// What becomes of interrupted work when it is settled, and what the user is told.
#include "base/CredentialCipher.h"
#include "inbound/modLoadXML.h"
#include "jobexport/JobLinkSettings.h"
#include "messagelist/frmMessageList.h"
#include "recovery/Interrupted.h"
#include "support/Hands.h"
#include "support/MariaDbServer.h"

TEST_F(Interrupted, AnExportIsMadeUnlessItHasBegun)
{
    InitCipherKey();
    quote("500").line(1).set("tosend", "A");
    putTemplate(730);
    const db::ConnectionPtr jobs = std::make_shared<db::Connection>();
    const Snapshot before;
    for (const auto& [status, message, statusAfter, told] : casesIn<4>("recovery/exports.txt")) {
        mariaDb().createDatabase(u"jobs"_s, files::read(checkoutFile(u"sql/joblink.sql"_s)));
        jobs->open(mariaDb().connectionText(u"jobs"_s));
        {  // without JobLink's settings nothing is exported yet
            QString text = authorisedQuote("500").labour(1, "C").text();
            files::write(gsUnreadPath + u"m.xml"_s, text);
            const journal::Operation operation(journal::Kind::Load, u"m.xml"_s, journal::hashOf(text));
            ASSERT_TRUE(LoadXML(text, u"m.xml"_s));
            if (!status.isEmpty()) {
                jobs->execute(u"INSERT INTO newJob SET Status=%1"_s.arg(status));
                journal::keep(u"job"_s, 1);
            }
        }
        // as if the process had died, and the workstation had been renamed
        gConn->execute(u"UPDATE KESTOperation SET State='open', Workstation='OTHER'"_s);
        storeJobLinkSettings({u"127.0.0.1"_s, mariaDb().port(), u"jobs"_s, mariaDb().user(), mariaDb().password()});
        if (message == "gone"_L1)
            files::remove(gsUnreadPath + u"m.xml"_s);

        recovery::settle();

        const QList<recovery::Settled> settled = recovery::takeSettled();
        EXPECT_EQ(settled.value(0).left.join(u' '), told);
        QStringList found;
        db::Recordset rows(jobs);
        for (rows.open(u"SELECT Status FROM newJob"_s); !rows.eof(); rows.moveNext())
            found += rows.text(u"Status"_s);
        EXPECT_EQ(found.join(u' '), statusAfter);
        EXPECT_EQ(files::exists(gsUnreadPath + u"m.xml"_s), false);
        before.restore();
        EnsureConnection();
    }
}

TEST_F(Interrupted, ASendIsNotFinishedOverItsAnswer)
{
    sendable("600").stage(1).note("Submitted KEST Quote").quoteNumber("KQ7");  // sent again after a revision
    send("600");
    // the process died before it could end the operation, and the answer is there before anybody settles
    for (const auto& [stage, number, note, expected] : casesIn<4>("recovery/answers.txt")) {
        plainRows(u"UPDATE KESTOperation SET State='open', PastPoint=0"_s);
        quote("600").locked(false).stage(stage.toInt()).quoteNumber(number).remarks("").note(note);
        recovery::settle();
        EXPECT_EQ(quote("600").state(), expected.toStdString());
    }
}

TEST_F(Interrupted, AResponseWaitsUntilItsLastTryIsSettled)
{
    arrive("R_500_0.xml", submissionResponse("KQ7"));
    for (const char* state : {"open", "taken back"}) {
        gConn->execute(
            sql("INSERT INTO KESTOperation (OperationKind, State, FileName) VALUES ('response', '{}', "
                "'R_500_0.XML')",
                QString::fromLatin1(state)));
        listed();
        EXPECT_EQ(quote("500").text("KESTQuoteNo"), QLatin1StringView(state) == "open"_L1 ? "KQ1" : "KQ7") << state;
        gConn->execute(u"DELETE FROM KESTOperation WHERE State='open'"_s);
    }
}

TEST_F(Interrupted, TheUserIsToldWhatBecameOfIt)
{
    const QDateTime started(QDate(2026, 11, 23), QTime(10, 31));
    for (const auto& [kind, file, number, outcome, sentence] : casesIn<5>("recovery/sentences.txt")) {
        recovery::Settled settled;
        settled.operation.kind = kind;
        settled.operation.file = file;
        settled.operation.number = number;
        settled.operation.started = started;
        settled.outcome = recovery::Outcome(QStringList{u"taken back"_s, u"finished"_s, u"left"_s}.indexOf(outcome));
        EXPECT_EQ(settled.sentence(), sentence);
    }
}

TEST_F(Interrupted, TheListTellsWhatWasSettledBesideItsMessages)
{
    frmMessageList window;
    const auto line = [&] { return window.findChild<QLabel*>(u"lblStatus"_s)->text(); };
    const auto loseConnectionAt = [](int number, const std::function<void()>& work) {
        int statement = 0;
        db::setStatementFault([&] { return ++statement == number; }, CannotOpen);
        attempt(work);
        db::setStatementFault({});
    };
    arrive("m.xml", adjustedQuote("500"));
    loseConnectionAt(20, [] { loadAsTheWindow(u"m.xml"_s); });
    window.openUnread();
    EXPECT_TRUE(line().startsWith(u"The load of m.xml was interrupted"_s) && line().endsWith(u" No unread messages"_s))
        << line();

    bool isTold = false;
    for (int number = 1; number < 50 && !isTold; ++number) {
        arrive("m.xml", adjustedQuote("500"));
        bool isLoaded = true;
        loseConnectionAt(number, [&] { isLoaded = window.loadFile(u"m.xml"_s); });  // and the delayed refresh
        isTold = !isLoaded && line().startsWith(u"The load of m.xml was interrupted"_s);
    }
    EXPECT_TRUE(isTold);
    window.RefreshList();
    EXPECT_FALSE(line().contains(u"interrupted"_s)) << line();
}

TEST_F(Interrupted, WhatNobodySawIsTold)
{
    const QString sublets = uR"(window "Sublet Authority Documents")"_s;
    const QString document = u" I subletAuthorityDocument=JVBERi0xLjQ="_s;
    const std::tuple<QString, const char*, QStringList> cases[] = {
        {u"QREQ quoteRequestNumber=QR9"_s, "frmPrintPreview", {uR"(report "Quote Request")"_s}},
        {u"AUQT\nsublet 5"_s + document, "frmPrintPreview", {uR"(report "Authorised Quote")"_s, sublets}},
        {u"AUQT\nsublet 6"_s + document, "frmSubletAuth", {sublets}},
        {u"EWAP"_s, "", {}},
    };
    for (const int number : {710, 730})
        putTemplate(number);
    for (const auto& [message, window, notShown] : cases) {  // the process ends while the window is open
        SCOPED_TRACE(window);
        arrive("m.xml", Message::told(message));
        desktop.emplace(R"({"windows": {")" + QByteArray(window) + R"(": [[{"click": "nothing"}]]}})");
        if (*window) {
            EXPECT_ANY_THROW(loadAsTheWindow(u"m.xml"_s));  // as an unattended command ends
        } else {
            loadAsTheWindow(u"m.xml"_s);
            newest().set("State", "open");
        }
        recovery::settle();
        EXPECT_EQ(newest().text("State"), "finished");
        const QString moved = journal::entryOf(newest().id()).facts[u"newName"_s].toString();
        EXPECT_TRUE(filesIn(gsReadPath).contains(moved));
        QStringList told;
        for (const QString& what : notShown)
            told += u"Its %1 was not shown: reprint %2 from the read messages."_s.arg(what, moved);
        const QList<recovery::Settled> settled = recovery::takeSettled();
        ASSERT_EQ(settled.size(), 1);
        EXPECT_EQ(settled[0].left, told);
    }
}

TEST_F(Interrupted, ALoadedMessageThatCouldNotBeMovedIsMovedLater)
{
    std::string loaded;
    for (const bool byLoad : {false, true}) {
        arrive("m.xml", adjustedQuote("500"));
        frmMessageList window;
        {
            const QScopedValueRollback noReadFolder(gsReadPath, u"c:\\gone\\"_s);
            window.openUnread();
            EXPECT_TRUE(window.loadFile(u"m.xml"_s));
            EXPECT_NE(quote("500").notes(), loaded) << "a message that somebody puts back is a new one";
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
}

TEST_F(Interrupted, AMessageOutOfSightIsNotTakenForMoved)
{
    const QScopedValueRollback unread(gsUnreadPath);
    const QString seen = gsUnreadPath;
    putTemplate(710);
    arrive("m.xml", quoteRequest("QR9"));
    frmMessageList window;
    window.openUnread();
    const Hands hands({{u"frmPrintPreview"_s, [](QDialog&) { gsUnreadPath = u"c:\\gone\\"_s; }}});
    EXPECT_TRUE(window.loadFile(u"m.xml"_s));
    EXPECT_EQ(newest().text("State"), "unfinished");
    gsUnreadPath = seen;
    settleOutOfSight(gsUnreadPath);
    // the workstation died before anybody saw the report
    plainRows(u"UPDATE KESTOperation SET State='open', Facts=REPLACE(Facts, 'reportShown', 'not yet')"_s);
    settleOutOfSight(gsUnreadPath);
    recovery::settle();
    EXPECT_EQ(newest().text("State"), "done");
    EXPECT_TRUE(recovery::takeSettled().value(1).left.value(0).startsWith(uR"(Its report "Quote Request" was not)"_s));
    EXPECT_EQ(filesIn(gsUnreadPath).size() + 1, filesIn(gsReadPath).size());
}

namespace {

/// Someone who answers a box late.
struct Absent final : desktop::Answerer {
    explicit Absent(std::function<void()> inBetween) : meanwhile(std::move(inBetween)) {}
    desktop::Answer box(const desktop::Box& box) override
    {
        told.append(box.text);
        meanwhile();
        return desktop::Answer::Ok;
    }
    QString input(const desktop::Input&) override { return {}; }
    void start(const QString&) override {}
    std::function<void()> meanwhile;
    QStringList told;
};

}  // namespace

TEST_F(Interrupted, ABoxMayStayOpenUntilTheConnectionIsLost)
{
    sendable("600");
    for (const char* picture : {"600_0001.jpg", "600_0002.jpg"})
        files::write(gsImagesPath + QString::fromLatin1(picture), u"picture"_s);
    const auto absent = std::make_shared<Absent>([] {
        dropConnection();
        attempt([] { files::remove(gsImagesPath + u"600_0001.jpg"_s); });
    });
    desktop::setAnswerer(absent);
    EXPECT_EQ(failureOf([] { send("600"); }), 0);
    EnsureConnection();
    EXPECT_EQ(newest().text("State"), "done");
    EXPECT_TRUE(absent->told.last().contains(u"without the pictures 600_0001.jpg, which"_s));
}

TEST_F(Interrupted, AMessageThatAnotherLoadsWhileABoxIsOpenIsLeftAlone)
{
    frmMessageList window;
    std::unique_ptr<db::Lock> theirs;
    for (const bool isLoaded : {true, false}) {
        arrive("m.xml", excessWaiver("500"));
        window.openUnread();
        bool isBegun = false;
        desktop::setAnswerer(std::make_shared<Absent>([&] {
            if (std::exchange(isBegun, true))
                return;
            dropConnection();
            const db::ConnectionPtr other = anotherConnection();
            if (isLoaded)  // but not moved
                other->execute(
                    sql("INSERT INTO KESTOperation (OperationKind, State, PastPoint, FileName, FileHash) "
                        "VALUES ('load', 'unfinished', 1, 'm.xml', '{}')",
                        journal::hashOf(files::read(gsUnreadPath + u"m.xml"_s))));
            else
                theirs = std::make_unique<db::Lock>(other, recovery::loadLock(u"m.xml"_s), 5);
        }));
        EXPECT_FALSE(window.loadFile(u"m.xml"_s));
        EXPECT_EQ(quote("500").number("excess"), 500);
    }
    theirs.reset();
    desktop.emplace();
    EXPECT_TRUE(window.loadFile(u"m.xml"_s));
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
    settleOutOfSight(gsImagesPath);
    files::write(gsImagesPath + u"600_0003.jpg"_s, u"picture"_s);  // the document does not count it
    recovery::settle();
    EXPECT_EQ(filesIn(gsUnsentPath),
              (QStringList{u"600.0_1.xml"_s, u"I_600_0001.xml"_s, u"I_600_0002.jpg"_s, u"I_600_0002.xml"_s}));
    EXPECT_EQ(newest().text("State"), "done");
}

TEST_F(Interrupted, ChangesOfOwnersWhoLiveNoMoreAreTakenBackNewestFirst)
{
    const std::string claim = quote("500").text("Claim");
    QStringList locks;
    for (const QString& other : {u"C1"_s, u"C2"_s}) {
        const journal::Operation operation(journal::Kind::Save);
        gConn->execute(sql("UPDATE QUOTE1 SET Claim='{}' WHERE QTNNO='500' AND SUBQUOTE='0'", other));
        locks += journal::entryOf(newest().id()).lock;
    }
    plainRows(u"UPDATE KESTOperation SET State='open'"_s);
    {
        const db::ConnectionPtr owner = anotherConnection();
        const db::Lock older(owner, locks[0]), newer(owner, locks[1]);
        recovery::settle();
        EXPECT_EQ(quote("500").text("Claim"), "C2");
    }
    recovery::settle();
    EXPECT_EQ(quote("500").text("Claim"), claim);
    EXPECT_EQ(rowCount("KESTOperation", "State='taken back'"), 2);
}

TEST_F(Interrupted, AWindowThatLostItsSessionGoesOnUnlessOthersSettleItsWork)
{
    const db::ConnectionPtr other = anotherConnection();
    const std::tuple<const char*, const char*, const char*> cases[] = {
        {nullptr, "not free yet", "done"},  // the other workstation only has the lock
        {"UPDATE KESTOperation SET State='taken back' WHERE State='open'", "has settled it", "taken back"},
        {"UPDATE KESTJournal SET Settled=1", "has settled it", "open"},
    };
    for (const auto& [done, told, stateAfter] : cases) {
        quote("500").claim("C1");
        journal::Operation operation(journal::Kind::Save);
        gConn->execute(u"UPDATE QUOTE1 SET TOTAL=5 WHERE QTNNO='500'"_s);
        db::setStatementFault([] { return true; }, CannotOpen);
        EXPECT_EQ(failureOf([] { journal::keep(u"job"_s, 7); }), CannotOpen);
        db::setStatementFault({});
        ASSERT_TRUE(EnsureConnection());
        std::unique_ptr<db::Lock> settling;
        if (done)
            other->execute(QString::fromLatin1(done));
        else
            settling = std::make_unique<db::Lock>(other, journal::entryOf(newest().id()).lock);
        const auto change = [] { gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s); };
        EXPECT_TRUE(failure(change).description().contains(QString::fromLatin1(told))) << told;
        EXPECT_EQ(failureOf([] { journal::keep(u"job"_s, 7); }), RowChanged);
        EXPECT_EQ(quote("500").text("Claim"), "C1");
        settling.reset();
        EXPECT_EQ(failureOf(change), done ? RowChanged : 0) << "once the lock is free, it goes on";
        EXPECT_EQ(quote("500").text("Claim"), done ? "C1" : "C9");
        if (!done) {
            EXPECT_EQ(journal::kept(u"job"_s).toInt(), 7);
            EXPECT_EQ(journal::entryOf(newest().id()).serverSession, gConn->serverSession());
        }
        operation.end(journal::State::Done);
        EXPECT_EQ(newest().text("State"), stateAfter);
    }
}

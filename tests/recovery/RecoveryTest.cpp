// Work that loses its connection at any statement ends, once it is settled and repeated, as if nothing had happened. A
// whole operation is taken back, except for what others use or have changed.
#include "base/History.h"
#include "base/Journal.h"
#include "inbound/modLoadXML.h"
#include "messagelist/frmMessageList.h"
#include "messages/Folders.h"
#include "outbound/Sending.h"
#include "platform/RuntimeError.h"
#include "recovery/Recovery.h"
#include "recovery/TakeBack.h"
#include "support/Hands.h"

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
        quote("500").line(4, "MIS").set("unitcost", 12);
        quote("500").remarks("O'Brien \\ says\r\nso", "p_remarks");
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

    /// Interrupts work at each of its statements and repeats it. All must be as after undisturbed work. `prepare` is
    /// what comes before the work.
    void interruptEachStatement(
        const std::function<void()>& work, const std::function<void()>& again,
        const std::function<void()>& prepare = [] {})
    {
        const Snapshot before;
        prepare();
        work();
        again();
        const std::string expected = numberless();
        for (int number = 1;; ++number) {
            before.restore();
            EnsureConnection();
            recovery::takeSettled();
            prepare();
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

    static db::ConnectionPtr anotherConnection()
    {
        auto connection = std::make_shared<db::Connection>();
        connection->open(connectionText(driverNumber()));
        return connection;
    }

    static Row newest() { return Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)"); }
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
    const auto sendIfOpen = [] {
        if (!quote("600").locked())
            send("600");
    };
    interruptEachStatement([] { send("600"); }, sendIfOpen);
    EXPECT_EQ(outcomes, both);

    send("600");  // after this, the first change of another send is that of the car
    quote("600").locked(false).stage(1).remarks("(01/02/2008 : Active Quote Request)");
    car("ABC123").set("Year", "1998");
    interruptEachStatement([] { send("600"); }, sendIfOpen);
}

TEST_F(Interrupted, ASendIsNotFinishedOverItsAnswer)
{
    sendable("600");
    send("600");
    // the process died before it could end the operation, and the answer is there before anybody settles
    const struct {
        int stage;
        const char* notes;
        const char* expected;
    } answers[] = {
        {1, "Submitted KEST Quote", "3 locked - (01/02/2008 : Submitted KEST Quote)"},
        {4, "Submitted KEST Quote", "4 open - (01/02/2008 : Submitted KEST Quote)"},
        {1, "Deleted KEST Quote", "1 open - (01/02/2008 : Deleted KEST Quote)"},
    };
    for (const auto& [stage, notes, expected] : answers) {
        gConn->execute(u"UPDATE KESTOperation SET State='open', PastPoint=0"_s);
        quote("600").locked(false).stage(stage).remarks("").note(notes);
        recovery::settle();
        EXPECT_EQ(quote("600").state(), expected);
    }
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
    EXPECT_EQ(
        told,
        (QStringList{
            u"left: The load of m.xml"_s + at +
                u"Not all of it could be taken back; check the quote 500. The row of QUOTE1 with QTNNO 777 "
                "was changed by someone else and stays as it is."_s,
            u"taken back: The save in the utilities"_s + at + u"It has been taken back."_s,
            u"taken back: The load of AUQT_1007.xml"_s + at + u"It has been taken back; load the message again."_s,
            u"finished: The load of AUQT_1007.xml"_s + at +
                u"It has been finished. Its message has been removed or changed since, so it was not moved."_s,
            u"taken back: The send of quote 1007"_s + at + u"The quote was not sent; send it again."_s,
            u"finished: The response R_1_0.xml"_s + at + u"It has been finished."_s,
        }));
    recovery::settle();
    EXPECT_TRUE(recovery::takeSettled().isEmpty());
}

TEST_F(Interrupted, TheListTellsWhatWasSettledBesideItsMessages)
{
    arrive("m.xml", adjustedQuote("500"));
    EXPECT_TRUE(interrupt(20, [] { loadAsTheWindow(u"m.xml"_s); }));
    frmMessageList window;
    const auto line = [&] { return window.findChild<QLabel*>(u"lblStatus"_s)->text(); };
    window.openUnread();
    EXPECT_TRUE(line().startsWith(u"The load of m.xml was interrupted"_s) && line().endsWith(u" No unread messages"_s))
        << line();

    bool isTold = false;
    for (int number = 1; number < 50 && !isTold; ++number) {
        arrive("m.xml", adjustedQuote("500"));
        int statement = 0;
        db::setStatementFault([&] { return ++statement == number; }, CannotOpen);
        const bool isLoaded = window.loadFile(u"m.xml"_s);  // which includes the delayed refresh
        db::setStatementFault({});
        isTold = !isLoaded && line().startsWith(u"The load of m.xml was interrupted"_s);
    }
    EXPECT_TRUE(isTold);
    window.RefreshList();
    EXPECT_FALSE(line().contains(u"interrupted"_s)) << line();
}

TEST_F(Interrupted, WhatNobodySawIsTold)
{
    const QString report = u"Its report \"%1\" was not shown: reprint %2.xml from the read messages."_s;
    const std::pair<Text, const char*> document("subletAuthorityDocument", "JVBERi0xLjQ=");
    const struct {
        Message message;
        const char* window;  // the process ends while it is open
        QStringList told;
    } cases[] = {
        {quoteRequest("QR9"), "frmPrintPreview", {report.arg(u"Quote Request"_s)}},
        {authorisedQuote("500").sublet(5, "I", {document}),
         "frmPrintPreview",
         {report.arg(u"Authorised Quote"_s),
          u"Its window \"Sublet Authority Documents\" was not shown: reprint %2.xml from the read messages."_s}},
        {authorisedQuote("500").sublet(6, "I", {document}),
         "frmSubletAuth",
         {u"Its window \"Sublet Authority Documents\" was not shown: reprint %2.xml from the read messages."_s}},
        {excessWaiver("500"), "", {}},
    };
    for (const int number : {710, 730})
        putTemplate(number);
    for (const auto& [message, window, told] : cases) {
        SCOPED_TRACE(window);
        arrive("m.xml", message);
        desktop.emplace(R"({"windows": {")" + QByteArray(window) + R"(": [[{"click": "nothing"}]]}})");
        if (*window)
            EXPECT_ANY_THROW(loadAsTheWindow(u"m.xml"_s));
        else
            loadAsTheWindow(u"m.xml"_s);
        const QStringList before = filesIn(gsReadPath);
        gConn->execute(
            u"UPDATE KESTOperation SET State='open' WHERE Operation=(SELECT MAX(Operation) FROM "
            "(SELECT Operation FROM KESTOperation) AS n)"_s);
        recovery::settle();
        const QList<recovery::Settled> settled = recovery::takeSettled();
        ASSERT_EQ(settled.size(), 1);
        QStringList expected;
        for (const QString& file : filesIn(gsReadPath))
            for (const QString& sentence : before.contains(file) ? QStringList() : told)
                expected += QString(sentence).replace(u"%2.xml"_s, file);
        EXPECT_EQ(settled[0].left, expected);
        EXPECT_EQ(expected.size(), told.size());
    }
}

TEST_F(Interrupted, ALoadedMessageThatCouldNotBeMovedIsMovedLater)
{
    for (const bool byLoad : {false, true}) {
        arrive("m.xml", adjustedQuote("500"));
        frmMessageList window;
        std::string loaded;
        {
            const QScopedValueRollback noReadFolder(gsReadPath, u"c:\\gone\\"_s);
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

TEST_F(Interrupted, AReportMayStayOpenUntilTheConnectionIsLost)
{
    putTemplate(710);
    arrive("QR9_001.jpg", "picture");
    arrive("m.xml", quoteRequest("QR9").images({"1"}));
    const Hands hands({{u"frmPrintPreview"_s, [](QDialog&) { dropConnection(); }}});
    EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s));
    EXPECT_EQ(shown(), "");
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
}

TEST_F(Interrupted, ABoxMayStayOpenUntilTheConnectionIsLost)
{
    struct Absent final : desktop::Answerer {
        desktop::Answer box(const desktop::Box&) override
        {
            dropConnection();
            return desktop::Answer::Ok;
        }
        QString input(const desktop::Input&) override { return {}; }
        void start(const QString&) override {}
    };
    sendable("600");
    files::write(gsImagesPath + u"600_0001.jpg"_s, u"picture"_s);
    desktop::setAnswerer(std::make_shared<Absent>());
    EXPECT_EQ(failureOf([] { send("600"); }), 0);
    EXPECT_EQ(newest().text("State"), "done");
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
    for (const int lost : {30, 1000}) {  // before and after the point of no return
        const auto load = [lost] {
            int statement = 0;
            db::setStatementFault([&] { return ++statement >= lost; }, CannotOpen);
            attempt([] { loadAsTheWindow(u"m.xml"_s); });
            db::setStatementFault({});
            if (lost == 1000)  // the process dies before it can close the operation
                gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);
        };
        const auto settle = [] {
            EnsureConnection();
            recovery::settle();
        };
        interruptEachStatement(settle, loadIfItWaits, load);
    }
    EXPECT_EQ(outcomes, both) << "nothing is left";
}

TEST_F(Interrupted, TheNewestChangeOfARowIsTakenBackFirst)
{
    const std::string claim = quote("500").text("Claim");
    for (const QString& other : {u"C1"_s, u"C2"_s}) {
        const journal::Operation operation(journal::Kind::Save);
        gConn->execute(sql("UPDATE QUOTE1 SET Claim='{}' WHERE QTNNO='500' AND SUBQUOTE='0'", other));
    }
    gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);
    recovery::settle();
    EXPECT_EQ(quote("500").text("Claim"), claim);
    EXPECT_EQ(rowCount("KESTOperation", "State='taken back'"), 2);
}

TEST_F(Interrupted, WorkOfALivingOwnerIsLeftAlone)
{
    journal::Operation operation(journal::Kind::Save);
    gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s);
    const QString lock = journal::entryOf(newest().id()).lock;
    operation.end(journal::State::Done);
    gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);

    const db::ConnectionPtr owner = anotherConnection();
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
    const db::ConnectionPtr owner = anotherConnection();
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

// --- Taking a whole load back ---

struct TakeBackOfALoad : Interrupted {
    /// Loads a message and returns the load's operation.
    static qint64 loaded(const Message& message)
    {
        files::write(gsUnreadPath + u"m.xml"_s, message.text());
        EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s));
        return toLong(opened(u"SELECT MAX(Operation) AS newest FROM KESTOperation"_s).value(u"newest"_s));
    }

    /// All rows, without the files.
    static std::string rows()
    {
        QStringList lines = QString::fromStdString(holdings()).split(u'\n');
        lines.removeIf([](const QString& line) { return line.startsWith(u'/'); });
        return lines.join(u'\n').toStdString();
    }
};

TEST_F(TakeBackOfALoad, LeavesAllRowsAsTheyWere)
{
    desktop.emplace(R"({"boxes": [{"text": "want to continue", "answer": "yes"}]})");
    vendor("Straightline Alignment");  // a new one would stay
    const std::string before = rows();
    for (const Message& message :
         {authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").paint(3, "I").sublet(4, "C"),
          manualQuote("500").labour(1, "I").part(2, "I"), cancellation("QR1"), excessWaiver("500"),
          assessmentResult("KQ1"), quoteDeletion("KQ1"), quoteDeletion("KQ2")}) {
        const qint64 operation = loaded(message);
        EXPECT_NE(rows(), before);
        EXPECT_EQ(recovery::obstaclesTo(operation), QStringList());
        EXPECT_EQ(recovery::takeBack(operation), QStringList());
        EXPECT_EQ(difference(before, rows()), "\n");
    }
}

TEST_F(TakeBackOfALoad, KeepsWhatOtherLoadsMayUse)
{
    const qint64 operation = loaded(quoteRequest("QR9").rego("NEW001"));
    const int counter = Row("CINFO", "1=1").value("QUOTE_VAL").toInt();
    EXPECT_EQ(recovery::takeBack(operation), QStringList());
    EXPECT_EQ(rowCount("QUOTE1", "KESTQRNo='QR9'") + rowCount("QUOTE3", "QTNNO NOT IN ('500')"), 0);
    EXPECT_EQ(rowCount("CAR", "REGO='NEW001'"), 1);
    EXPECT_EQ(rowCount("CUSTOMER", "CUST_ID IN (SELECT CUST_ID FROM CAR WHERE REGO='NEW001')"), 1);
    EXPECT_EQ(Row("CINFO", "1=1").value("QUOTE_VAL").toInt(), counter);
}

TEST_F(TakeBackOfALoad, LeavesARowThatSomeoneElseHasChangedWhole)
{
    // the load writes the line twice; of neither write anything may go
    const qint64 operation =
        loaded(authorisedQuote("500").set("excess", "400").labour(1, "C").paint(3, "I").part(2, "D"));
    quote("500").line(3).set("script", "by the host");
    quote("500").line(1).set("rrhour", 77);
    const std::string itemNumber = quote("500").line(3).text("itemno");

    const QStringList left = recovery::obstaclesTo(operation);
    EXPECT_EQ(left.filter(u"The row of QUOTE2 with "_s).filter(u"changed by someone else and stays as it is."_s).size(),
              2);
    EXPECT_EQ(recovery::takeBack(operation), left);
    EXPECT_TRUE(quote("500").line(3).shows("category=PAINT script=by the host"));
    EXPECT_EQ(quote("500").line(3).text("itemno"), itemNumber);
    EXPECT_EQ(quote("500").line(1).number("rrhour"), 77);
    EXPECT_TRUE(quote("500").line(2).shows("category=PRT rrhour=80")) << "the deleted line is back";
    EXPECT_EQ(quote("500").state(), "3 open KQ1 (01/02/2008 : Responded Quote Request)");
    EXPECT_EQ(quote("500").number("excess"), 500);
}

TEST_F(TakeBackOfALoad, LeavesANewQuoteThatSomeoneElseWorksOn)
{
    const std::function<void(const QString&)> uses[] = {
        [](const QString& number) { quote(number).line(9); },
        [](const QString& number) {
            addRow("QUOTE3", {{"QTNNO", number}, {"Subquote", 0}});
        },
        [](const QString& number) {
            addRow("DEBTOR", {{"QTNNO", number}});
        },
    };
    int request = 0;
    for (const auto& use : uses) {
        const qint64 operation = loaded(quoteRequest(u"QR9%1"_s.arg(++request)));
        const QString number = journal::entryOf(operation).number;
        use(number);
        const QStringList told{u"Quote %1/0 has lines, notes or an invoice from elsewhere and stays."_s.arg(number)};
        EXPECT_EQ(recovery::obstaclesTo(operation), told);
        EXPECT_EQ(recovery::takeBack(operation), told);
        EXPECT_NE(quote(number).notes(), "") << "with its notes, or nobody could send it";
    }
}

}  // namespace kest::test

// A load is undone as a whole or not at all. What is taken back leaves what others use or have changed.
#include "recovery/Interrupted.h"
#include "recovery/TakeBack.h"
#include "recovery/Undo.h"

struct UndoOfALoad : Interrupted {
    UndoOfALoad()
    {
        vendor("Straightline Alignment");  // a new one would stay
        car("ABC123").set("KEST", 1);      // the new mark, too
    }

    static qint64 loaded(const QString& file, const Message& message)
    {
        files::write(gsUnreadPath + file, message.text());
        EXPECT_TRUE(loadAsTheWindow(file));
        return newest().id();
    }
    static Message authorisation()
    {
        return authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").sublet(4, "I");
    }
    static QString titleAndState(qint64 operation)
    {
        const journal::Entry entry = journal::entryOf(operation);
        return journal::titleOf(entry) + u": "_s + entry.state;
    }
};

TEST_F(UndoOfALoad, LeavesAllAsItWas)
{
    desktop.emplace(R"({"boxes": [{"text": "want to continue", "answer": "yes"}]})");
    for (const Message& message :
         {authorisation().labour(0, "I").paint(3, "I"), manualQuote("500").labour(1, "I").part(2, "I"),
          manualQuote("700").labour(1, "I"), manualQuote("500/3").labour(1, "I"), cancellation("QR1"),
          excessWaiver("500"), assessmentResult("KQ1"), quoteDeletion("KQ1"), quoteDeletion("KQ2")}) {
        arrive("m.xml", message);
        const std::string before = holdings();
        std::string afterLoad = before;
        for (int time = 1; time <= 2; ++time) {
            const qint64 load = loaded(u"m.xml"_s, message);
            EXPECT_EQ(difference(afterLoad, holdings()) == "\n", time == 2) << "it can be loaded again";
            afterLoad = holdings();
            EXPECT_EQ(recovery::undo(load).told, QStringList());
            EXPECT_EQ(difference(before, holdings()), "\n") << "the message is unread again, too";
        }
    }
}

TEST_F(UndoOfALoad, IsAskedForAndIsAnOperationItself)
{
    const qint64 load = loaded(u"m.xml"_s, authorisation());
    shown();
    EXPECT_FALSE(recovery::askAndUndo(load)) << "the default is No";
    EXPECT_TRUE(shown().starts_with("[exclamation] Undo: Undo the load of m.xml of "));
    EXPECT_EQ(titleAndState(load), u"load of m.xml: done"_s);
    desktop.emplace(R"({"boxes": [{"text": "Undo the load", "answer": "yes"}]})");
    EXPECT_TRUE(recovery::askAndUndo(load));
    EXPECT_EQ(titleAndState(load), u"load of m.xml: taken back"_s);
    EXPECT_EQ(titleAndState(newest().id()), u"undo of the load of m.xml: done"_s);
    QStringList told;
    for (const journal::RecordedChange& change : journal::changesOf(newest().id()))
        told += journal::linesOf(change.row);
    EXPECT_EQ(told.filter(uR"(excess: "400" -> "500")"_s, Qt::CaseInsensitive).size(), 1)
        << told.join(u'\n').toStdString();
    EXPECT_EQ(journal::historyOf(u"500"_s, {}).value(0).id, newest().id());
}

TEST_F(UndoOfALoad, IsFinishedIfItFailed)
{
    const Snapshot before;
    for (int number = 1, statement = 1; statement >= number - 1; ++number) {  // until one is not reached
        before.restore();
        EnsureConnection();
        const qint64 load = loaded(u"m.xml"_s, authorisation());
        statement = 0;
        db::setStatementFault([&] { return ++statement == number; });
        attempt([&] { recovery::undo(load); });
        db::setStatementFault({});
        EnsureConnection();  // the fault may have cost the connection
        recovery::settle();
        const bool isBegun = newest().id() != load;
        EXPECT_EQ(titleAndState(load), isBegun ? u"load of m.xml: taken back"_s : u"load of m.xml: done"_s) << number;
        EXPECT_EQ(files::exists(gsUnreadPath + u"m.xml"_s), isBegun) << number;
    }
}

TEST_F(UndoOfALoad, IsRefusedWithTheReason)
{
    qint64 load = 0;
    std::vector<std::pair<QString, std::function<void()>>> cases{
        {u"There is no operation 999."_s, [&] { load = 999; }},
        {u"the newest operation on quote 500: the load of n.xml was"_s,
         [] { loaded(u"n.xml"_s, excessWaiver("500")); }},
        {u"It has moved the picture"_s,
         [&] {
             arrive("QR9_001.jpg", "picture");
             load = loaded(u"n.xml"_s, quoteRequest("QR9").images({"1"}));
         }},
        {u"no longer among the read messages."_s, [] { files::remove(gsReadPath + filesIn(gsReadPath)[0]); }},
        {u"Another m.xml is among the unread messages."_s, [this] { arrive("m.xml", authorisation()); }},
        {u"It has deleted the waiting request QREQ.xml."_s,
         [&] {
             arrive("QREQ.xml", quoteRequest("QR1"));
             arrive("n.xml", manualQuote("500"));
             plainRows(u"UPDATE CAR SET REGO='GONE'"_s);
             EXPECT_FALSE(loadAsTheWindow(u"n.xml"_s)) << "which has deleted it all the same";
             plainRows(u"UPDATE CAR SET REGO='ABC123'"_s);
             load = loaded(u"n.xml"_s, manualQuote("500"));
         }},
    };
    for (const auto& [reason, statement] : casesIn<2>("recovery/not-undone.txt"))
        cases.emplace_back(reason, [statement] { plainRows(statement); });
    quote("500").set("invoiced", 0);  // so that the load does not write it
    const Snapshot start;
    for (const auto& [reason, prepare] : cases) {
        SCOPED_TRACE(reason.toStdString());
        load = loaded(u"m.xml"_s, authorisation());
        prepare();
        const std::string before = holdings();
        shown();
        EXPECT_FALSE(recovery::askAndUndo(load));
        const std::string box = "[exclamation] Undo: Operation " + std::to_string(load) + " can't be undone.\r\n\r\n";
        EXPECT_TRUE(shown().starts_with(box));
        const QStringList reasons = recovery::obstaclesToUndo(load);
        EXPECT_TRUE(reasons.size() == 1 && reasons[0].contains(reason)) << reasons.join(u'|').toStdString();
        EXPECT_EQ(failureOf([&] { recovery::undo(load); }), RowChanged);
        EXPECT_EQ(difference(before, holdings()), "\n");
        start.restore();
        EnsureConnection();
    }
}

TEST_F(UndoOfALoad, LeavesTheRestOnceItsQuoteIsChanged)
{
    const qint64 load = loaded(u"m.xml"_s, authorisation());
    const journal::Entry entry = journal::entryOf(load);
    {
        journal::Operation undo(journal::Kind::Undo, entry.file, entry.hash);
        journal::keep(u"undoes"_s, load);
        journal::openNow(entry.number, entry.subquote);
        undo.end(journal::State::Open);  // as one that has failed
        const QScopedValueRollback away(gsReadPath, u"c:\\gone\\"_s);
        EXPECT_EQ(recovery::settleLoadOf(u"n.xml"_s, entry.hash), recovery::EarlierLoad::Pending);
    }
    gConn->execute(sql("UPDATE KESTJournal SET Settled=1 WHERE Operation={} AND TableName='QUOTE2'", load));
    journal::Operation save(journal::Kind::Save);
    gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s);
    save.end(journal::State::Done);
    for (int time = 1; time <= 2; ++time) {  // the second as if the process had died before the undo's end
        recovery::settle();
        const QStringList left = recovery::takeSettled().value(0).left;
        EXPECT_EQ(left.filter(u"not the newest operation on quote 500: the save in the utilities was later."_s).size(),
                  1);
        EXPECT_EQ(titleAndState(load), u"load of m.xml: interrupted"_s);
        EXPECT_EQ(quote("500").stage(), 4);
        gConn->execute(u"UPDATE KESTOperation SET State='open' WHERE OperationKind='undo'"_s);
    }
}

TEST_F(UndoOfALoad, IsDoneThoughADocumentCouldNotBeRemoved)
{
    const std::pair<Text, const char*> sublet("subletAuthorityDocument", "JVBERi0xLjQ=");
    const qint64 load = loaded(u"m.xml"_s, authorisation().sublet(5, "I", {sublet}));
    const QString document = journal::entryOf(load).facts[u"documents"_s][0][0].toString();
    QFile::setPermissions(files::systemPath(document), QFile::ReadOwner);
    const recovery::Undone undone = recovery::undo(load);
    EXPECT_EQ(undone.told, QStringList(u"Its document %1 could not be removed."_s.arg(document)));
    EXPECT_EQ(titleAndState(newest().id()), u"undo of the load of m.xml: done"_s);
    EXPECT_TRUE(files::exists(gsUnreadPath + u"m.xml"_s));
}

TEST_F(UndoOfALoad, IsRefusedOrToldIfARowIsChangedMeanwhile)
{
    Message message = authorisation();
    for (int line = 10; line < 130; ++line)
        message.labour(line, "I");  // more than a transaction takes back
    const std::tuple<const char*, QLatin1StringView, QLatin1StringView> cases[] = {
        {"SELECT * FROM KESTOperation WHERE OperationKind='undo'", "done"_L1, "failed"_L1},
        {"SELECT * FROM KESTJournal WHERE Settled=1", "interrupted"_L1, "interrupted"_L1},
    };
    const Snapshot before;
    for (const auto& [moment, loadAfter, undoAfter] : cases) {
        before.restore();
        EnsureConnection();
        const db::ConnectionPtr host = anotherConnection();
        const qint64 load = loaded(u"m.xml"_s, message);
        bool isWatching = true;
        db::setStatementFault([&, reached = moment] {
            if (!std::exchange(isWatching, false))
                return false;
            db::Recordset rows(host);
            rows.open(QString::fromLatin1(reached));
            isWatching = rows.eof();
            if (!isWatching)
                host->execute(u"UPDATE QUOTE2 SET rrhour=77 WHERE QTNNO='500' AND SEQ_NO=10"_s);
            return false;
        });
        attempt([&] { EXPECT_TRUE(recovery::undo(load).sentence().contains(u"only in part"_s)); });
        db::setStatementFault({});
        recovery::settle();
        EXPECT_EQ(titleAndState(load), u"load of m.xml: "_s + loadAfter);
        EXPECT_EQ(titleAndState(newest().id()), u"undo of the load of m.xml: "_s + undoAfter);
        EXPECT_EQ(quote("500").stage(), loadAfter == "done"_L1 ? 4 : 3);
        EXPECT_EQ(quote("500").line(10).number("rrhour"), 77);
        EXPECT_EQ(filesIn(gsUnreadPath), QStringList()) << "or it would be loaded over the rest";
    }
}

TEST_F(UndoOfALoad, PutsItsMessageBackOnce)
{
    const Snapshot before;
    for (const bool isPutBack : {false, true}) {
        for (const bool isLoadedAgain : {false, true}) {
            const qint64 load = loaded(u"m.xml"_s, authorisation());
            files::makeFolder(gsUnreadPath + u"m.xml"_s);  // in the way of the move
            EXPECT_EQ(recovery::undo(load).state, journal::State::Unfinished);
            if (isLoadedAgain)  // under another name
                loaded(u"n.xml"_s, authorisation());
            QDir(files::systemPath(gsUnreadPath + u"m.xml"_s)).removeRecursively();
            if (isPutBack)
                arrive("m.xml", authorisation());
            if (!isPutBack && !isLoadedAgain)
                settleOutOfSight(gsReadPath);
            recovery::settle();
            EXPECT_EQ(rowCount("KESTOperation", "State='unfinished'"), 0);
            EXPECT_EQ(filesIn(gsUnreadPath).size(), isPutBack || !isLoadedAgain ? 1 : 0);
            EXPECT_EQ(filesIn(gsReadPath).size(), isLoadedAgain ? 2 : 0);
            before.restore();
            EnsureConnection();
        }
    }
}

TEST_F(UndoOfALoad, KeepsWhatOtherLoadsMayUse)
{
    const qint64 operation = loaded(u"m.xml"_s, quoteRequest("QR9").rego("NEW001"));
    const int counter = Row("CINFO", "1=1").value("QUOTE_VAL").toInt();
    EXPECT_EQ(recovery::takeBack(operation), QStringList());
    EXPECT_EQ(rowCount("QUOTE1", "KESTQRNo='QR9'") + rowCount("QUOTE3", "QTNNO NOT IN ('500')"), 0);
    EXPECT_EQ(rowCount("CAR", "REGO='NEW001'"), 1);
    EXPECT_EQ(rowCount("CUSTOMER", "CUST_ID IN (SELECT CUST_ID FROM CAR WHERE REGO='NEW001')"), 1);
    EXPECT_EQ(Row("CINFO", "1=1").value("QUOTE_VAL").toInt(), counter);
}

TEST_F(UndoOfALoad, LeavesARegistrationThatOtherQuotesUse)
{
    for (const char* statement : {"UPDATE CAR SET REGO='AB C123'", "UPDATE QUOTE1 SET REGO='AB C123'"})
        gConn->execute(QString::fromLatin1(statement));
    const Snapshot before;
    const std::tuple<bool, bool, bool> cases[] = {
        {false, false, false}, {true, false, false}, {true, true, false}, {true, true, true}};
    for (const auto& [isInUse, isInTheWay, isWayInUse] : cases) {
        if (isInTheWay)
            car("ABC123");
        const qint64 operation = loaded(u"m.xml"_s, manualQuote("500"));
        if (isInUse)
            quote("501").rego("ABC123");
        if (isWayInUse)
            quote("502").rego("ABC123.");                        // to which the car in the way was moved
        const bool stays = isInUse && isInTheWay == isWayInUse;  // otherwise quote 501 would have no car
        QStringList told;
        for (const QString& rego : QStringList(isWayInUse, u"ABC123."_s) + QStringList(stays, u"ABC123"_s))
            told += u"Other quotes have the registration %1 by now, so its car keeps it."_s.arg(rego);
        EXPECT_EQ(recovery::obstaclesTo(operation), told);
        EXPECT_EQ(recovery::takeBack(operation), told);
        EXPECT_EQ(quote("500").text("REGO"), stays ? "ABC123" : "AB C123") << "which is that of its car";
        EXPECT_EQ(rowCount("CAR", "REGO='AB C123'"), stays ? 0 : 1);
        EXPECT_EQ(rowCount("CAR", "REGO='ABC123'"), isInUse ? 1 : 0);
        EXPECT_EQ(quote("500").stage(), 3) << "the rest goes back";
        before.restore();
        EnsureConnection();
    }
}

TEST_F(UndoOfALoad, LeavesARowThatSomeoneElseHasChangedWhole)
{
    // the load writes the line twice; of neither write anything may go
    const qint64 operation = loaded(u"m.xml"_s, authorisation().paint(3, "I").labour(8, "I"));
    quote("500").line(3).set("Report_on", 1);  // the load gave it no value, so the table gave it 0
    quote("500").line(1).set("rrhour", 77);
    const std::string itemNumber = quote("500").line(3).text("itemno");

    const QStringList left = recovery::obstaclesTo(operation);
    EXPECT_EQ(left.filter(u"The row of QUOTE2 with itemid "_s).filter(u"changed by someone else and stays as"_s).size(),
              2);
    plainRows(u"UPDATE KESTOperation SET State='open', PastPoint=0"_s);  // as if the load had been interrupted
    recovery::settle();
    const recovery::Settled settled = recovery::takeSettled().value(0);
    EXPECT_EQ(settled.left, left);
    EXPECT_TRUE(settled.sentence().contains(u"check the quote 500. The row of QUOTE2 with itemid "_s));
    EXPECT_EQ(titleAndState(operation), u"load of m.xml: interrupted"_s);
    EXPECT_TRUE(quote("500").line(3).shows("category=PAINT Report_on=1"));
    EXPECT_EQ(rowCount("QUOTE2", "SEQ_NO=8"), 0);
    EXPECT_EQ(quote("500").line(3).text("itemno"), itemNumber);
    EXPECT_EQ(quote("500").line(1).number("rrhour"), 77);
    EXPECT_TRUE(quote("500").line(2).shows("category=PRT rrhour=80")) << "the deleted line is back";
    EXPECT_EQ(quote("500").state(), "3 open KQ1 (01/02/2008 : Responded Quote Request)");
    EXPECT_EQ(quote("500").number("excess"), 500);
}

TEST_F(UndoOfALoad, LeavesANewQuoteThatSomeoneElseWorksOn)
{
    for (const char* use : {"QUOTE2 (Subquote, SEQ_NO, QTNNO) VALUES (0, 9,", "QUOTE3 (Subquote, QTNNO) VALUES (0,",
                            "DEBTOR (QTNNO) VALUES ("}) {
        const qint64 operation = loaded(u"m.xml"_s, quoteRequest(std::string(use, 6)));
        const QString number = journal::entryOf(operation).number;
        plainRows(u"INSERT INTO %1 '%2')"_s.arg(QLatin1StringView(use), number));
        const QStringList told{u"Quote %1/0 has lines, notes or an invoice from elsewhere and stays."_s.arg(number)};
        EXPECT_EQ(recovery::obstaclesTo(operation), told);
        EXPECT_EQ(recovery::takeBack(operation), told);
        EXPECT_NE(quote(number).notes(), "") << "with its notes, or nobody could send it";
    }
}

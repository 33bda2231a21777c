// A load is undone as a whole or not at all.
#include "base/History.h"
#include "platform/RuntimeError.h"
#include "recovery/Recovery.h"
#include "recovery/Undo.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

struct UndoOfALoad : Shop {
    UndoOfALoad()
    {
        quote("500").request("QR1").quoteNumber("KQ1").stage(3).set("excess", 500).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        vendor("Straightline Alignment");
    }
    ~UndoOfALoad() override { db::setStatementFault({}); }

    static qint64 newest()
    {
        return toLong(opened(u"SELECT MAX(Operation) AS newest FROM KESTOperation"_s).value(u"newest"_s));
    }
    /// Loads a message and returns the load's operation.
    static qint64 loaded(const QString& file, const Message& message, bool isLoaded = true)
    {
        files::write(gsUnreadPath + file, message.text());
        EXPECT_EQ(loadAsTheWindow(file), isLoaded);
        return newest();
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

}  // namespace

TEST_F(UndoOfALoad, LeavesAllAsItWasAndIsAnOperationItself)
{
    arrive("m.xml", authorisation());
    const std::string before = holdings();
    ASSERT_TRUE(loadAsTheWindow(u"m.xml"_s));
    const qint64 load = newest();

    EXPECT_EQ(recovery::undo(load), QStringList());

    EXPECT_EQ(difference(before, holdings()), "\n") << "the message is unread again, too";
    EXPECT_EQ(titleAndState(load), u"load of m.xml: taken back"_s);
    EXPECT_EQ(titleAndState(newest()), u"undo of the load of m.xml: done"_s);
    QStringList told;
    for (const journal::RecordedChange& change : journal::changesOf(newest()))
        told += journal::linesOf(change.row);
    EXPECT_EQ(told.filter(uR"(excess: "400" -> "500")"_s, Qt::CaseInsensitive).size(), 1)
        << told.join(u'\n').toStdString();
    EXPECT_EQ(journal::historyOf(u"500"_s, {}).value(0).id, newest());
    EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s)) << "and can be loaded again";
}

TEST_F(UndoOfALoad, IsRefusedWithTheReason)
{
    const struct {
        const char* reason;
        std::function<qint64()> prepare;  // returns the operation to undo
    } cases[] = {
        {"There is no operation 999.", [] { return 999; }},
        {"is no load.",
         [] {
             loaded(u"m.xml"_s, authorisation());
             journal::Operation save(journal::Kind::Save);
             gConn->execute(u"UPDATE QUOTE1 SET CLAIM='C9' WHERE QTNNO='500'"_s);
             save.end(journal::State::Done);
             return newest();
         }},
        {"The state of the load is \"failed\".",
         [] {
             const journal::Operation load(journal::Kind::Load, u"m.xml"_s);
             gConn->execute(u"UPDATE QUOTE1 SET CLAIM='C9' WHERE QTNNO='500'"_s);
             return newest();
         }},
        {"It is not the newest operation on quote 500: the load of n.xml was later.",
         [] {
             const qint64 first = loaded(u"m.xml"_s, authorisation());
             loaded(u"n.xml"_s, excessWaiver("500"));
             return first;
         }},
        {"It has exported job 17 to JobLink.",
         [] {
             journal::Operation load(journal::Kind::Load, u"m.xml"_s, journal::hashOf(authorisation().text()));
             loaded(u"m.xml"_s, authorisation());
             journal::keep(u"job"_s, 17);
             load.end(journal::State::Done);
             return newest();
         }},
        {"It has moved the picture",
         [this] {
             arrive("QR9_001.jpg", "picture");
             return loaded(u"m.xml"_s, quoteRequest("QR9").images({"1"}));
         }},
        {"Its message is no longer among the read messages.",
         [] {
             const qint64 load = loaded(u"m.xml"_s, authorisation());
             files::remove(gsReadPath + journal::entryOf(load).facts[u"newName"_s].toString());
             return load;
         }},
        {"Another m.xml is among the unread messages.",
         [this] {
             const qint64 load = loaded(u"m.xml"_s, authorisation());
             arrive("m.xml", authorisation());
             return load;
         }},
        {"The row of QUOTE1 with",
         [] {
             const qint64 load = loaded(u"m.xml"_s, authorisation());
             quote("500").set("excess", 77);
             return load;
         }},
    };
    const Snapshot start;
    for (const auto& [reason, prepare] : cases) {
        SCOPED_TRACE(reason);
        const qint64 operation = prepare();
        const std::string before = holdings();
        const QStringList reasons = recovery::obstaclesToUndo(operation);
        EXPECT_TRUE(reasons.size() == 1 && reasons[0].contains(QString::fromLatin1(reason)))
            << reasons.join(u'|').toStdString();
        EXPECT_EQ(failureOf([&] { recovery::undo(operation); }), RowChanged);
        EXPECT_EQ(difference(before, holdings()), "\n");
        start.restore();
        EnsureConnection();
    }
}

TEST_F(UndoOfALoad, AsksFirstAndSaysWhyItIsRefused)
{
    const qint64 load = loaded(u"m.xml"_s, authorisation());
    const std::string before = holdings();
    shown();
    EXPECT_FALSE(recovery::askAndUndo(999));
    EXPECT_EQ(shown(), "[exclamation] Undo: Operation 999 can't be undone.\r\n\r\nThere is no operation 999.");
    EXPECT_FALSE(recovery::askAndUndo(load)) << "the default is No";
    EXPECT_TRUE(shown().starts_with("[exclamation] Undo: Undo the load of m.xml of "));
    EXPECT_EQ(difference(before, holdings()), "\n");
    desktop.emplace(R"({"boxes": [{"text": "Undo the load", "answer": "yes"}]})");
    EXPECT_TRUE(recovery::askAndUndo(load));
    EXPECT_TRUE(files::exists(gsUnreadPath + u"m.xml"_s));
}

TEST_F(UndoOfALoad, IsFinishedIfItWasInterrupted)
{
    arrive("m.xml", authorisation());
    const std::string before = holdings();
    int finished = 0;
    for (int number = 1;; ++number) {
        const qint64 load = loaded(u"m.xml"_s, authorisation());
        recovery::takeSettled();
        int statement = 0;
        db::setStatementFault([&] { return ++statement == number; }, CannotOpen);
        attempt([&] { recovery::undo(load); });
        db::setStatementFault({});
        EXPECT_TRUE(EnsureConnection());
        recovery::settle();
        for (const recovery::Settled& settled : recovery::takeSettled()) {
            finished += settled.outcome == recovery::Outcome::Finished;
            EXPECT_TRUE(settled.sentence().startsWith("The undo of the load of m.xml was interrupted"_L1));
        }
        if (!files::exists(gsUnreadPath + u"m.xml"_s)) {  // it was interrupted before it began
            EXPECT_EQ(recovery::undo(load), QStringList()) << "statement " << number;
        }
        EXPECT_EQ(difference(before, holdings()), "\n") << "statement " << number;
        EXPECT_EQ(titleAndState(load), u"load of m.xml: taken back"_s) << "statement " << number;
        EXPECT_EQ(rowCount("KESTOperation", "State IN ('open', 'unfinished')"), 0) << "statement " << number;
        if (statement < number)
            break;
    }
    EXPECT_GT(finished, 5);
}

}  // namespace kest::test

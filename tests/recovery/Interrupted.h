// A shop whose work is interrupted.
#pragma once

#include "base/History.h"
#include "base/Journal.h"
#include "outbound/Sending.h"
#include "recovery/Recovery.h"

namespace kest::test {

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

}  // namespace kest::test

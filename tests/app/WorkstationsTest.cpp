// Tests two workstations with the same database and message folders. The second one is the command `kest2`.
#include "messagelist/frmMessageList.h"
#include "outbound/SendQuote.h"
#include "support/Hands.h"
#include "support/Shop.h"

struct Workstations : Shop {
    /// Creates a second profile that uses the database and drive C: of the first.
    Workstations()
    {
        QDir().mkpath(second_);
        for (const QString& shared : {u"/drive_c"_s, u"/databases"_s})
            EXPECT_TRUE(QFile::link(root() + shared, second_ + shared));
        const QString file = u"/registry.ini"_s;
        EXPECT_TRUE(settings::createKey(settings::Hive::LocalMachine, u"SOFTWARE"_s));
        files::writeBytes(second_ + file, files::readBytes(root() + file));
    }

    /// Returns the exit codes of loads that start at the same time, each on its own workstation.
    std::vector<int> loadTogether(const QStringList& messages) const
    {
        const QString profiles[] = {root(), second_};
        std::vector<std::unique_ptr<QProcess>> commands;
        for (const QString& message : messages) {
            commands.push_back(std::make_unique<QProcess>());
            commands.back()->start(QStringLiteral(KEST_COMMAND),
                                   {u"--profile"_s, profiles[commands.size() - 1], u"load"_s, message});
        }
        std::vector<int> codes;
        for (const auto& command : commands) {
            EXPECT_TRUE(command->waitForFinished() && command->exitStatus() == QProcess::NormalExit);
            codes.push_back(command->exitCode());
        }
        return codes;
    }

    /// Loses the connection and lets the other workstation fill its list, which settles what this one has begun.
    void beAway() const
    {
        dropConnection();
        for (int i = 0; i < 50 && rowCount("KESTOperation", "State='open'") > 0; ++i)
            EXPECT_EQ(
                QProcess::execute(QStringLiteral(KEST_COMMAND), {u"--profile"_s, second_, u"list"_s, u"unread"_s}), 0);
    }

private:
    const QString second_ = root() + u"/second"_s;
};

TEST_F(Workstations, AMessageThatBothLoadIsLoadedOnce)
{
    quote("500").request("QR1").quoteNumber("KQ1").note("Responded Quote Request").line(1);
    const Message messages[] = {quoteRequest("QR2"), authorisedQuote("500").labour(1, "C").labour(2, "I"),
                                manualQuote("500").part(1, "I"), cancellation("QR1")};
    const Snapshot before;
    for (const Message& message : messages) {
        arrive("m.xml", message);
        EXPECT_EQ(loadTogether({u"m.xml"_s}), std::vector({0}));
        const std::string once = holdings();
        for (int round = 1; round <= 3; ++round) {
            before.restore();
            arrive("m.xml", message);
            const std::vector<int> codes = loadTogether({u"m.xml"_s, u"m.xml"_s});
            EXPECT_EQ(codes[0] + codes[1], 1) << "one has loaded it, the other one not";
            EXPECT_EQ(difference(once, holdings()), "\n");
        }
        before.restore();
    }
}

TEST_F(Workstations, TwoRequestsTakeTwoNumbers)
{
    const Snapshot before;
    for (int round = 1; round <= 3; ++round) {
        arrive("m1.xml", quoteRequest("QR1").rego("ONE111"));
        arrive("m2.xml", quoteRequest("QR2").rego("TWO222"));
        EXPECT_EQ(loadTogether({u"m1.xml"_s, u"m2.xml"_s}), std::vector({0, 0}));
        for (const char* number : {"1001", "1002"})
            EXPECT_EQ(rowCount("QUOTE1", "QTNNO='" + std::string(number) + "'"), 1);
        EXPECT_EQ(Row("CINFO", "1=1").text("QUOTE_VAL"), "1003");
        before.restore();
    }
}

/// Lets the other workstation load a message before the first statement of a send, then before the second, and so on.
/// While a change and its record are written, it would only wait: then its turn comes with the next statement after
/// them.
TEST_F(Workstations, ALoadDuringASendLosesNothing)
{
    quote("500").request("QR1").note("Active Quote Request").line(1).set("rrhour", 2).set("rr_rate2", 50);
    arrive("m.xml", cancellation("QR1"));
    const Snapshot before;
    int overtakenCount = 0;
    for (int statement = 1, last = 1; statement <= last; ++statement) {
        ASSERT_TRUE(openHostQuote(u"500"_s, u"0"_s));
        last = 0;
        bool hadItsTurn = false;
        db::setStatementFault([&] {
            if (++last >= statement && !hadItsTurn && !GetConnection()->isInChange()) {
                hadItsTurn = true;
                EXPECT_EQ(loadTogether({u"m.xml"_s}), std::vector({0}));
            }
            return false;
        });
        bool sent = false;
        const int failure = failureOf([&] { SendQuote(*grsQuote, &sent); });
        db::setStatementFault({});
        if (!hadItsTurn)
            break;  // no statement follows the send's last change
        const bool refused = shown().find("cannot be sent") != std::string::npos;
        const std::string notes = quote("500").notes();
        EXPECT_NE(notes.find("QR Cancelled"), std::string::npos) << statement << ": " << notes;
        EXPECT_EQ(notes.find("Sending KEST Quote") != std::string::npos, sent) << statement << ": " << notes;
        EXPECT_TRUE(sent || failure == RowChanged || refused) << statement << ": " << failure;
        overtakenCount += failure == RowChanged;
        SendQuote(*grsQuote);
        EXPECT_EQ(shown(), "[critical] This quote request has been cancelled, Quote cannot be sent.");
        before.restore();
    }
    EXPECT_GT(overtakenCount, 0);
}

TEST_F(Workstations, AnOpenReportLeavesItsLoadToTheOtherThatHasSettledIt)
{
    putTemplate(710);
    arrive("m.xml", quoteRequest("QR1"));
    const Hands hands({{u"frmPrintPreview"_s, [this](QDialog&) { beAway(); }}});
    frmMessageList window;
    window.openUnread();
    window.loadFile(u"m.xml"_s);
    EXPECT_EQ(Row("KESTOperation", "1=1").text("State"), "finished");
    EXPECT_EQ(filesIn(gsReadPath), QStringList(u"1001.xml"_s));
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
    EXPECT_EQ(rowCount("QUOTE1") + rowCount("KESTOperation"), 2) << "loaded once";
}

// Tests the simulated transport: what it carries, when, and what it reports.
#include "app/TransportCommand.h"
#include "loopback/Transport.h"
#include "loopback/TransportWindow.h"
#include "outbound/Sending.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"

const QDate today(2008, 3, 21);

/// A shop with a quote that can be sent, and a transport.
struct Loopback : Sending {
    Loopback()
    {
        desktop.emplace(R"({"boxes":[{"text":"DELETED","answer":"yes"}]})");
        quote("1004").request("20504").note("Active Quote Request");
        fill(quote("1004").line(1, "R&R", "Bumper"), "rrhour=2 rr_rate2=50");
        fill(quote("1004").line(2, "RA", "Guard"), "rahour=3 rr_rate2=50");
        fill(quote("1004").line(3, "PAINT", "Guard"), "pthour=1 rr_rate2=50");
        fill(quote("1004").line(4, "PRT", "Lamp"), "qty=1 unitcost=80 rrhour=100");
        rules({});
        restart();
    }

    void restart() { transport.emplace(folders()); }
    static app::TransportFolders folders()
    {
        return {gsUnreadPath, gsUnsentPath, gsSentPath, profile::componentFolder() + u'/'};
    }
    void rules(const QString& text) { files::write(folders().own + app::Transport::rulesName, text); }

    /// Runs the transport and returns what it carried, as "out file" and "in file". Errors fail the test.
    std::string carried()
    {
        const app::Carry carry = transport->carry(today);
        EXPECT_EQ(carry.faults, QStringList());
        QStringList all;
        for (const app::Carried& file : carry.carried)
            all << (file.direction == app::Carried::Direction::Out ? u"out "_s : u"in "_s) + file.file;
        return all.join(u", "_s).toStdString();
    }
    std::string faults() { return transport->carry(today).faults.join(u'\n').toStdString(); }

    /// Loads the only listed message and returns its type.
    static std::string loadOne()
    {
        const QStringList files = listed();
        EXPECT_EQ(files.size(), 1) << files.join(u' ');
        EXPECT_TRUE(loadAsTheWindow(files.value(0)));
        return files.value(0).section(u'_', 2, 2).toStdString();
    }
    static std::string in(const QString& folder) { return files::list(folder).join(u' ').toStdString(); }

    std::optional<app::Transport> transport;
};

TEST_F(Loopback, EachMessageLoads)
{
    ASSERT_GT(send("1004"), 0);
    carried();
    const QString answer = files::list(gsUnreadPath).value(0);
    const QString text = files::read(gsUnreadPath + answer);
    for (const auto& [step, type] : casesIn<2>("loopback/steps.txt")) {
        files::write(gsUnreadPath + answer, text);
        listed();
        rules(u"on start quote=1004 claim=7701004\n  "_s + step);
        carried();
        EXPECT_EQ(loadOne(), type.toStdString());
        listed();  // because an old answer would lock the quote again
    }
    EXPECT_EQ(desktop->boxes().filter(u"critical|"_s), QStringList());
}

TEST_F(Loopback, AStepWaitsUntilTheShopHasDealtWithTheOneBefore)
{
    rules(u"on start\n  request number=20777 pictures=1\n  cancel\n  reinstate wait=1\n"_s);
    EXPECT_EQ(carried(), "in 20777_001.jpg, in 20777_001.txt, in WEB_000001_QREQ_20777.xml");
    EXPECT_EQ(carried(), "");
    EXPECT_EQ(loadOne(), "QREQ");
    EXPECT_EQ(carried(), "in WEB_000002_QRCN_20777.xml");
    files::remove(gsUnreadPath + u"WEB_000002_QRCN_20777.xml"_s);
    EXPECT_EQ(carried(), "") << "it waits one carry longer";
    EXPECT_EQ(carried(), "in WEB_000003_BCQR_20777.xml");
    EXPECT_EQ(carried(), "");
}

TEST_F(Loopback, AQuoteSentAgainFollowsItsNextRule)
{
    rules(u"on quote 1004\n  revise\n  adjust\non quote 1004\n  adjust\n"_s);
    ASSERT_GT(send("1004"), 0);
    carried();
    listed();
    carried();
    EXPECT_EQ(loadOne(), "RRQT");
    EXPECT_EQ(in(gsUnreadPath), "");
    ASSERT_GT(send("1004"), 0);
    EXPECT_EQ(carried(), "out 1004.0_2.xml, in R_1004_0_600003.xml");
    EXPECT_EQ(carried(), "in WEB_000002_ADQT_1004.xml") << "what the first rule had left is over";
}

TEST_F(Loopback, APictureGoesWithItsDocument)
{
    const QString document = u"<request><kestQuoteNumber>1004/0</kestQuoteNumber></request>"_s;
    files::write(gsUnsentPath + u"I_1004_0001.xml"_s, document);
    files::write(gsUnsentPath + u"I_1004_0002.jpg"_s, u"picture"_s);
    EXPECT_EQ(carried(), "");
    files::write(gsUnsentPath + u"I_1004_0001.JPG"_s, u"picture"_s);
    files::write(gsSentPath + u"I_1004_0001.jpg"_s, u"of an earlier send"_s);
    EXPECT_EQ(carried(), "out I_1004_0001.JPG, out I_1004_0001.xml");
    EXPECT_EQ(files::read(gsSentPath + u"I_1004_0001.jpg"_s), u"picture"_s);
    EXPECT_EQ(in(gsUnsentPath), "I_1004_0002.jpg");
}

TEST_F(Loopback, WhatCannotBeSentIsToldOnceForEachChange)
{
    for (const QString& text :
         {u"<quoteBody>"_s, QString(), u"\u0001\u00ff&"_s, sentDocument(""), sentDocument("1004/12"),
          sentDocument("../1004/0"), sentDocument("10_04/0"), u"<!DOCTYPE x []><quoteBody/>"_s}) {
        files::write(gsUnsentPath + u"odd.xml"_s, text);
        EXPECT_TRUE(faults().starts_with("odd.xml")) << text;
        EXPECT_EQ(faults(), "") << text;
        EXPECT_EQ(files::read(gsUnsentPath + u"odd.xml"_s), text);
    }
    files::write(gsUnsentPath + u"I_odd.xml"_s, u"<request>"_s);
    files::write(gsUnsentPath + u"I_odd.jpg"_s, {});
    EXPECT_NE(faults(), "");
    files::remove(gsUnsentPath + u"I_odd.xml"_s);

    ASSERT_GT(send("1004"), 0);
    files::write(gsSentPath + u"1004.0_1.xml"_s, u"another"_s);
    EXPECT_EQ(faults(), "1004.0_1.xml: a document of this name has already been sent");
    EXPECT_EQ(files::read(gsSentPath + u"1004.0_1.xml"_s), u"another"_s);
    EXPECT_EQ(in(gsUnreadPath), "");
}

TEST_F(Loopback, WhatFailedIsDoneAgainWithTheSameNumbers)
{
    ASSERT_GT(send("1004"), 0);
    for (const QString& folder : {gsSentPath, gsUnreadPath}) {
        const QFile::Permissions read = QFile::ReadOwner | QFile::ExeOwner;
        ASSERT_TRUE(QFile::setPermissions(files::systemPath(folder), read));
        for (int twice = 0; twice < 2; ++twice) {
            EXPECT_NE(faults(), "");
            restart();
        }
        EXPECT_EQ(in(gsUnreadPath), "") << "no answer to a quote that has not gone";
        EXPECT_EQ(in(gsUnsentPath), folder == gsSentPath ? "1004.0_1.xml" : "");
        ASSERT_TRUE(QFile::setPermissions(files::systemPath(folder), read | QFile::WriteOwner));
    }
    EXPECT_EQ(carried(), "in R_1004_0_600002.xml");
}

TEST_F(Loopback, RulesWithAFaultStopEverythingUntilTheyAreMended)
{
    rules(u"on quote 1004\n  nothing\n"_s);
    ASSERT_GT(send("1004"), 0);
    EXPECT_NE(faults().find("insurer.rules: line 2: "), std::string::npos);
    EXPECT_EQ(faults(), "");
    EXPECT_EQ(in(gsUnsentPath), "1004.0_1.xml");
    rules(u"on quote 1004\n  authorise\n  waive\n"_s);
    carried();
    EXPECT_EQ(faults(), "insurer.rules, line 1, quote 1004, authorise: the claim is not known; give it with claim=");
    EXPECT_EQ(faults(), "");
}

TEST_F(Loopback, TheWindowShowsWhatIsCarried)
{
    desktop.emplace(R"({"windows":{"KESTWeb":[[{"click":"carryButton"}, {"read":["carriedList","status"]},
        {"key":"KESTWeb","keys":"Alt+C"}]]}})");
    ASSERT_GT(send("1004"), 0);
    EXPECT_TRUE(app::runTransport(app::TransportMode::Window, {}));
    EXPECT_EQ(desktop->read(u"carriedList"_s, u"rows"_s)[0][2].toString(), u"1004.0_1.xml"_s);
    EXPECT_TRUE(desktop->read(u"status"_s).toString().endsWith(u"2 files carried so far."_s));

    app::TransportRunner first(folders(), [](const app::Carry&) {});
    ASSERT_TRUE(first.claim());
    EXPECT_FALSE(app::runTransport(app::TransportMode::Window, {}));
    EXPECT_EQ(desktop->boxTexts().last(), u"KESTWeb is running already."_s) << "there is no window to show";
    EXPECT_FALSE(app::runTransport(app::TransportMode::Once, {}));
}

TEST_F(Loopback, ASecondStartShowsTheWindowThatIsOpen)
{
    const auto work = [&](QDialog& window) {
        window.showMinimized();
        std::atomic<bool> answered = false;
        const std::unique_ptr<QThread> second(
            QThread::create([&] { answered = app::TransportWindow::raiseOther(folders()); }));
        second->start();
        while (!second->isFinished())
            desktop::gestures::settle();
        EXPECT_TRUE(answered);
        EXPECT_FALSE(window.isMinimized());
        EXPECT_TRUE(window.isActiveWindow());
    };
    const Hands hands({{u"KESTWeb"_s, work}});
    EXPECT_TRUE(app::runTransport(app::TransportMode::Window, {}));
    EXPECT_EQ(desktop->boxTexts(), QStringList());
}

TEST_F(Loopback, TheListOfTheWindowStaysWhereItsUserReads)
{
    const auto work = [this](QDialog& window) {
        auto& list = control<QTreeWidget>(window, "carriedList");
        const auto carry = [&](int times) {
            for (int i = 0; i < times; ++i) {
                rules(u"no rule"_s + u"!"_s.repeated(i % 2));  // a new fault, and so a new row
                control<QPushButton>(window, "carryButton").click();
            }
            desktop::gestures::settle();
        };
        QScrollBar& bar = *list.verticalScrollBar();
        carry(50);
        EXPECT_EQ(bar.value(), bar.maximum()) << "follows the newest";
        bar.setValue(3);
        carry(1);
        EXPECT_EQ(bar.value(), 3);
        QTreeWidgetItem* newest = list.topLevelItem(list.topLevelItemCount() - 1);
        list.sortByColumn(0, Qt::DescendingOrder);
        carry(2001 - list.topLevelItemCount());
        EXPECT_EQ(list.topLevelItemCount(), 2000);
        EXPECT_GE(list.indexOfTopLevelItem(newest), 0) << "only the oldest are taken away";
        EXPECT_EQ(list.topLevelItem(0)->text(1), u"Fault"_s);
    };
    const Hands hands({{u"KESTWeb"_s, work}});
    app::TransportWindow(folders()).run();
}

// Tests the panel: its options, its keys, and what it shows when it opens.
#include "base/Journal.h"
#include "support/Hands.h"
#include "support/Shop.h"

struct Panel : test::Shop {
    /// Shows the panel for a quote, does the steps and returns the boxes.
    QStringList show(const char* quote, const QByteArray& steps)
    {
        desktop.emplace(R"json({"windows": {"frmKEST": [[)json" + steps + "]]}}");
        eKEST().ShowKESTWindow(QString::fromLatin1(quote), u"0"_s);
        return desktop->boxes();
    }
};

TEST_F(Panel, EnterRunsTheChosenOptionLikeOk)
{
    const QStringList noQuote(u"information||No quote is open.|ok"_s);
    const std::pair<const char*, QStringList> cases[] = {
        {R"json({"click": "Option1(3)"}, {"click": "cmdOK"})json", noQuote},
        {R"json({"click": "Option1(3)"}, {"key": "Option1(3)", "keys": "Return"})json", noQuote},
        {R"json({"click": "Option1(3)"}, {"key": "Option1(3)", "keys": "Shift+Return"})json", {}},
        // nothing happens if there is no transport program
        {R"json({"click": "Option1(0)"}, {"click": "cmdOK"}, {"click": "cmdOK"}, {"click": "cmdExit"})json", {}}};
    for (const auto& [steps, boxes] : cases)
        EXPECT_EQ(show("0", steps), boxes) << steps;
}

TEST_F(Panel, APersonIsToldOnceWhatWasSettled)
{
    struct Person final : desktop::Answerer {
        desktop::Answer box(const desktop::Box& box) override
        {
            texts.append(box.text);
            return desktop::Answer::Ok;
        }
        QString input(const desktop::Input&) override { return {}; }
        void start(const QString&) override {}
        QStringList texts;
    };
    gConn->execute(
        u"INSERT INTO KESTOperation (OperationKind, State, FileName, LockName, StartedAt) VALUES ('load', "
        "'open', 'm.xml', 'x', '2026-11-23T10:31:00')"_s);
    const auto person = std::make_shared<Person>();
    desktop::setAnswerer(person);
    const auto sendAfterLoss = [](QDialog& window) {
        if (!test::control<QRadioButton>(window, "Option1(2)").isEnabled())
            return;
        {
            const journal::Operation operation(journal::Kind::Save);
            gConn->execute(u"UPDATE QUOTE1 SET CLAIM='7700003' WHERE QTNNO='500'"_s);
            test::dropConnection();
        }
        test::control<QRadioButton>(window, "Option1(2)").click();
        test::control<QPushButton>(window, "cmdOK").click();
    };
    const test::Hands hands({{u"frmKEST"_s, sendAfterLoss}});
    for (int opened = 0; opened < 2; ++opened)
        eKEST().ShowKESTWindow(u"0"_s, u"0"_s);
    EXPECT_EQ(person->texts, QStringList(u"The load of m.xml was interrupted on 23/11/2026 at 10:31. It has been taken "
                                         "back; load the message again."_s));
    test::quote("500");
    eKEST().ShowKESTWindow(u"500"_s, u"0"_s);
    ASSERT_EQ(person->texts.size(), 3) << "before the send, and by it";
    EXPECT_TRUE(person->texts[1].endsWith(u"It has been taken back."_s)) << person->texts[1];
}

TEST_F(Panel, WithoutAConnectionItIsNotShown)
{
    gConn->close();
    files::remove(profile::root() + u"/databases/WirSql.db"_s);
    EXPECT_EQ(show("500", R"json({"read": ["cmdOK"]})json").size(), 1) << "the box that says why";
    EXPECT_TRUE(desktop->record().reads.isEmpty());
}

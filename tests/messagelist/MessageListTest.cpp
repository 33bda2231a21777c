// Tests the window of the message list: folders, filter, search, load and removal.
#include "messagelist/MessageListModel.h"
#include "messagelist/frmMessageList.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"

struct MessageListWindow : Shop {
    /// Opens the window, does the steps and closes it.
    void visit(const QStringList& steps, const QString& answers = u"\"boxes\": []"_s)
    {
        desktop.emplace(
            u"{\"windows\": {\"frmMessageList\": [[%1]], \"frmViewXML\": [[{\"read\": [\"txtXML\"]}]]}, %2}"_s
                .arg(steps.join(u','), answers)
                .toUtf8());
        frmMessageList::ShowForm();
    }

    /// Returns what the reading step with that number has read of a control.
    QJsonValue seen(int reading, const QString& control, const QString& what) const
    {
        return desktop->record().reads.at(reading)[u"values"_s][control][what];
    }

    std::string text(int reading, const QString& control) const
    {
        return seen(reading, control, u"text"_s).toString().toStdString();
    }

    /// Returns the rows of the list and the line under it.
    std::string listed(int reading = 0) const
    {
        QStringList names;
        for (const QJsonValue row : seen(reading, u"ListView1"_s, u"rows"_s).toArray())
            names << row[0].toString();
        return names.join(u' ').toStdString() + ": " + text(reading, u"lblStatus"_s);
    }
};

// Steps of visits.
const QString readAll =
    uR"({"read": ["ListView1", "cmdProcess", "cmdPrint", "Frame2", "txtFilter", "lblStatus", "cmdHeld"]})"_s;

static QString click(const char* control)
{
    return u"{\"click\": \"%1\"}"_s.arg(QLatin1StringView(control));
}

static QString type(const char* control, const char* text)
{
    return u"{\"set\": \"%1\", \"text\": \"%2\"}"_s.arg(QLatin1StringView(control), QLatin1StringView(text));
}

static QString key(const char* control, const QString& names)
{
    return u"{\"key\": \"%1\", \"keys\": [\"%2\"]}"_s.arg(QLatin1StringView(control),
                                                          QString(names).replace(u" "_s, u"\", \""_s));
}

TEST_F(MessageListWindow, ALoadIsCompleteWhateverHappensWhileItsReportIsOpen)
{
    putTemplate(710);
    arrive("m.xml", quoteRequest("QR1"));
    std::optional<db::Lock> creating;
    const auto whileOpen = [&](QDialog&) {
        creating.emplace(anotherConnection(), u"new quote"_s);
        dropConnection();
    };
    const Hands hands({{u"frmPrintPreview"_s, whileOpen}});
    frmMessageList window;
    window.openUnread();
    EXPECT_TRUE(window.loadFile(u"m.xml"_s)) << shown();
    ASSERT_TRUE(creating && creating->isHeld());
    EXPECT_EQ(filesIn(gsReadPath).join(u' '), u"1001.xml"_s);
    EXPECT_EQ(Row("CINFO", "1=1").text("QUOTE_VAL"), "1002");
}

TEST_F(MessageListWindow, TheLineUnderTheListNamesTheFileThatEndedTheFill)
{
    quote("500");
    quote("501");
    gConn->execute(u"DELETE FROM QUOTE3 WHERE QTNNO='501'"_s);
    const QString answer = submissionResponse("KQ1").text();
    const std::tuple<QString, QString, QString> cases[] = {
        {u"R_502_1.xml"_s, answer, u"answers quote 502/1, which is no longer there"_s},
        {u"R_501_0.xml"_s, answer, u"answers quote 501, which has no notes row"_s},
        {u"R_500.xml"_s, answer, u"does not name the quote that it answers"_s},
        {u"R_500_.xml"_s, answer, u"does not name the quote that it answers"_s},
        {u"R_500_A.xml"_s, answer, u"does not name the quote that it answers"_s},
        {u"R_500_0.xml"_s, answer + u"<more/>"_s, u"contains no complete answer to quote 500"_s},
    };
    arrive("m.xml", cancellation("QR1"));
    arrive("m2.xml", cancellation("QR1"));
    for (const auto& [file, text, reason] : cases) {
        arrive(file, text);
        frmMessageList window;
        window.openUnread();
        EXPECT_EQ(window.findChild<QLabel*>(u"lblStatus"_s)->text(),
                  u"The list could not be filled: %1 %2. Move the file out of the folder; until then no messages are "
                  "listed."_s.arg(file, reason));
        EXPECT_TRUE(window.rows().isEmpty());
        EXPECT_TRUE(window.heldMessages().isEmpty()) << "of half a folder";
        files::remove(gsUnreadPath + file);
    }
    EXPECT_EQ(shown(), "");
    EXPECT_EQ(quote("500").text("KESTQuoteNo"), "");
}

TEST_F(MessageListWindow, ALoadedMessageMakesRoomForTheNextOfItsRequest)
{
    quote("500").request("QR1");
    arrive("a.xml", cancellation("QR1"));
    arrive("b.xml", cancellation("QR1"));
    visit({readAll, click("cmdProcess"), readAll});
    EXPECT_EQ(listed(0) + ", " + listed(1) + ", " + shown(),
              "a.xml: 1 message, b.xml: 1 message, [none] Message Loaded");
}

TEST_F(MessageListWindow, F4ShowsTheMessagesThatAreHeldBack)
{
    arrive("a.xml", cancellation("QR1"));
    visit({readAll});
    EXPECT_EQ(desktop->record().reads.last()[u"values"][u"cmdHeld"][u"visible"].toBool(), false);
    arrive("b.xml", cancellation("QR1"));
    desktop.emplace(R"json({"windows": {"frmMessageList": [[{"key": "ListView1", "keys": ["F4"]}]],
                                        "frmHeld": [[{"read": ["ListView1"]}, {"click": "cmdView"}]],
                                        "frmViewXML": [[{"read": ["txtXML"]}]]}})json");
    frmMessageList::ShowForm();
    const QJsonArray reads = desktop->record().reads;
    ASSERT_EQ(reads.size(), 2);
    const QJsonArray row = reads[0][u"values"][u"ListView1"][u"rows"][0].toArray();
    EXPECT_EQ(row[0].toString() + row[3].toString(), u"b.xmla.xml, which must be loaded first"_s);
    EXPECT_TRUE(reads[1][u"values"][u"txtXML"][u"text"].toString().contains(u"QR1"_s));
}

TEST_F(MessageListWindow, TheListIsFilledTwiceMoreAfterARefusal)
{
    arrive("a.xml", cancellation("QR1"));
    arrive("b.xml", "");
    visit({click("cmdProcess"), uR"({"wait": 600})"_s, readAll});
    EXPECT_EQ(listed(), "a.xml: 1 message");
    const QString unreadable = u"Message b.xml unreadable, Please contact MarlinDesk Support."_s;
    EXPECT_EQ(desktop->boxTexts().count(unreadable), 3);
    EXPECT_EQ(desktop->boxTexts().size(), 4);
    EXPECT_NE(desktop->boxTexts().value(1), unreadable) << "the refusal comes before the list is filled again";
}

TEST_F(MessageListWindow, EachFolderHasItsControls)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsReadPath + u"b.xml"_s, quoteMatch("123").text());
    visit({readAll, click("Option1(1)"), readAll, click("Option1(2)"), readAll, click("cmdView"), click("Command6"),
           click("Option1(0)"), readAll});
    const char* expected[] = {"a.xml: 1 message cmdProcess", "b.xml: 1 message cmdPrint Frame2",
                              ": No sent messages Frame2", "a.xml: 1 message cmdProcess"};
    for (int reading = 0; reading < 4; ++reading) {
        std::string shown = listed(reading);
        for (const QString& control : {u"cmdProcess"_s, u"cmdPrint"_s, u"Frame2"_s})
            shown += seen(reading, control, u"visible"_s).toBool() ? ' ' + control.toStdString() : "";
        EXPECT_EQ(shown, expected[reading]);
    }
    EXPECT_EQ(desktop->boxes(), QStringList()) << "View and Delete do nothing without a message";
}

TEST_F(MessageListWindow, TheFilterNarrowsTheReadMessages)
{
    for (int i = 0; i < 25; ++i)
        files::write(gsReadPath + u"%1.0_1.xml"_s.arg(100 + i), quoteMatch("123").text());
    visit({click("Option1(1)"), readAll});
    EXPECT_EQ(text(0, u"lblStatus"_s), "25 messages");
    EXPECT_EQ(desktop->prompts(), QStringList()) << "so many are listed unasked";
    files::write(gsReadPath + u"125.0_1.xml"_s, quoteMatch("123").text());
    visit({click("Option1(1)"), readAll, type("txtFilter", "11"), click("Command1"), readAll, type("txtFilter", "125"),
           key("txtFilter", u"Return"_s), readAll, type("txtFilter", ""), click("Command1"), readAll,
           click("Option1(2)"), readAll},
          uR"("inputs": [{"text": "Quote Number", "answer": "124"}])"_s);
    EXPECT_EQ(text(0, u"txtFilter"_s), "124") << "the answer to the prompt";
    const char* lines[] = {"1 message with \"124\" in their name", "10 messages with \"11\" in their name",
                           "1 message with \"125\" in their name", "26 messages"};
    for (int reading = 0; reading < 4; ++reading)
        EXPECT_EQ(text(reading, u"lblStatus"_s), lines[reading]);
    EXPECT_EQ(desktop->prompts(), QStringList{u"Enter a Quote Number to search by (Leave blank for all quotes)"_s})
        << "an empty filter that was typed asks nothing";
    EXPECT_EQ(text(4, u"txtFilter"_s), "") << "another folder begins without a filter";
}

TEST_F(MessageListWindow, ATabletOnItsOwnDatabaseLoadsRequestsOnly)
{
    gbTabletLocal = true;
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", cancellation("QR2"));
    visit({readAll, key("ListView1", u"Down"_s), readAll, uR"({"select": "ListView1", "item": 0})"_s, readAll});
    for (int reading = 0; reading < 3; ++reading)
        EXPECT_EQ(seen(reading, u"cmdProcess"_s, u"enabled"_s).toBool(), reading != 1);
    frmMessageList window;
    window.openUnread();
    EXPECT_FALSE(window.loadFile(u"b.xml"_s)) << "its button is disabled";
    EXPECT_EQ(desktop->boxes(), QStringList());
}

TEST_F(MessageListWindow, AMessageIsRemovedOnlyAfterYes)
{
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", quoteRequest("QR2"));
    visit({key("ListView1", u"Delete"_s), readAll});
    EXPECT_EQ(listed(), "a.xml b.xml: 2 messages");
    EXPECT_EQ(desktop->boxes(), QStringList{u"critical||You are about to remove a.xml without loading into the "
                                            "system. Are you SURE ?|no"_s});
    visit({key("ListView1", u"Delete"_s), readAll}, uR"("boxes": [{"text": "remove a.xml", "answer": "yes"}])"_s);
    EXPECT_EQ(listed(), "b.xml: 1 message");
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"b.xml"_s});
}

TEST_F(MessageListWindow, ADoubleClickShowsOnlyASentMessage)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsSentPath + u"s.xml"_s, sentDocument("500"));
    const QString doubleClick = uR"({"doubleClick": "ListView1"})"_s;
    visit({doubleClick, click("Option1(2)")});
    EXPECT_EQ(desktop->record().reads.size(), 0);
    visit({click("Option1(2)"), doubleClick});
    EXPECT_TRUE(text(0, u"txtXML"_s).starts_with("<request>"));
}

TEST(MessageListModel, NeitherSortsNorShowsLeadingBlanks)
{
    MessageListModel model;
    model.setMessages({{u"a.xml"_s, {u"Type"_s, {}, {}, u"  Zeta"_s}}, {u"b.xml"_s, {u"Type"_s, {}, {}, u" Alpha"_s}}},
                      MessageFolder::Unread);
    model.sort(4);
    EXPECT_EQ(model.data(model.index(0, 4)).toString() + model.data(model.index(1, 4)).toString(), u"AlphaZeta"_s);
}

// Three messages that the search distinguishes by every column.
struct Searched : MessageListWindow {
    Searched()
    {
        arrive("a.xml", quoteRequest("QR1").rego("ABC123").set("corporateCustomer", "Tarrant Tyres"));
        arrive("b.xml", quoteRequest("QR2").rego("XYZ789").set("corporateCustomer", "Holloway Haulage"));
        arrive("c.xml", cancellation("QR3"));
    }
};

TEST_F(Searched, WhatIsTypedInTheListLeavesTheRowsThatHoldIt)
{
    for (const auto& [keys, rows, line, chosen] : casesIn<4>("messages/search.txt")) {
        visit({key("ListView1", keys), readAll, click("Command6")});
        EXPECT_EQ(listed(), (rows + u": "_s + line).toStdString()) << keys;
        EXPECT_EQ(desktop->boxTexts().join(u' ').section(u' ', 5, 5), chosen) << keys;
    }
}

TEST_F(Searched, EndsWithTheFolder)
{
    files::write(gsReadPath + u"r.xml"_s, quoteRequest("QR9").text());
    visit({type("txtFind", "abc"), key("frmMessageList", u"F5"_s), readAll, type("txtFind", "zz"), click("cmdProcess"),
           click("cmdView"), click("Option1(1)"), readAll, type("txtFind", "zz"), click("cmdPrint"), readAll});
    EXPECT_EQ(listed(0) + ", " + listed(1) + ", " + listed(2),
              "a.xml: 1 of 3 messages, r.xml: 1 message, : 0 of 1 message");
    EXPECT_EQ(desktop->boxes(), QStringList()) << "a row that is not shown is not loaded, viewed or printed";
    EXPECT_EQ(filesIn(gsUnreadPath).size(), 3);
}

TEST_F(Searched, TheOrderOutlivesTheWindow)
{
    const auto state = [](QTreeView& list) {
        return u"%1 chosen, width %2, order %3 of column %4"_s
            .arg(list.currentIndex().siblingAtColumn(0).data().toString())
            .arg(list.header()->sectionSize(2))
            .arg(list.header()->sortIndicatorOrder())
            .arg(list.header()->sortIndicatorSection());
    };
    const auto work = [&](QDialog& window) {
        auto& list = control<QTreeView>(window, "ListView1");
        list.header()->resizeSection(2, 177);
        desktop::gestures::press(list, Qt::Key_Down);
        for (const int order : {0, 1, 0, 0, 1}) {  // ascending, descending, none, ascending, descending
            desktop::gestures::press(window, Qt::CTRL | Qt::Key_1);
            EXPECT_EQ(list.model()->index(0, 0).data(), order == 0 ? u"a.xml"_s : u"c.xml"_s);
            desktop::gestures::press(window, Qt::Key_F5);
            EXPECT_TRUE(state(list).startsWith(u"b.xml chosen, width 177"_s)) << state(list);
        }
        EXPECT_EQ(state(list), u"b.xml chosen, width 177, order 1 of column 0"_s);
    };
    const auto look = [&](QDialog& window) {
        EXPECT_EQ(state(control<QTreeView>(window, "ListView1")), u"c.xml chosen, width 177, order 1 of column 0"_s);
    };
    for (const Hands::Work& visit : {Hands::Work(work), Hands::Work(look)}) {
        const Hands hands({{u"frmMessageList"_s, visit}});
        frmMessageList::ShowForm();
    }
}

TEST_F(Searched, FilesAreDroppedOrPastedWhileTheUnreadMessagesAreShown)
{
    /// Creates a file as it comes from the mouse or the clipboard.
    const auto stick = [this](const QString& name, const QString& content) {
        auto data = std::make_unique<QMimeData>();
        data->setUrls({bring(name, content)});
        return data;
    };
    const auto drop = [](QDialog& window, const QMimeData& data) {
        QWidget& list = *control<QTreeView>(window, "ListView1").viewport();
        QDragEnterEvent enters(QPoint(9, 9), Qt::MoveAction | Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QCoreApplication::sendEvent(&list, &enters);
        QDropEvent drops(QPoint(9, 9), Qt::MoveAction | Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        if (enters.isAccepted())
            QCoreApplication::sendEvent(&list, &drops);
        desktop::gestures::settle();
        return enters.isAccepted() && drops.dropAction() == Qt::CopyAction;
    };
    const auto work = [&](QDialog& window) {
        const auto& line = control<QLabel>(window, "lblStatus");
        const auto paste = [&](std::unique_ptr<QMimeData> data) {
            QGuiApplication::clipboard()->setMimeData(data.release());
            desktop::gestures::press(window, Qt::CTRL | Qt::Key_V);
            return line.text();
        };
        EXPECT_TRUE(drop(window, *stick(u"d.xml"_s, cancellation("QR4").text())));
        EXPECT_EQ(line.text(), u"Taken in: 1 message. 4 messages"_s);
        EXPECT_EQ(paste(stick(u"c2.xml"_s, cancellation("QR3").text())),
                  u"Taken in: 1 message. 1 not listed yet: held back by missing pictures or an earlier message. "
                  "4 messages"_s);
        EXPECT_EQ(paste(std::make_unique<QMimeData>()), u"The clipboard contains no files."_s);
        paste(stick(u"e.doc"_s, {}));
        control<QAbstractButton>(window, "Option1(1)").click();
        EXPECT_FALSE(drop(window, *stick(u"f.xml"_s, cancellation("QR5").text())));
        EXPECT_EQ(paste(stick(u"f.xml"_s, cancellation("QR5").text())),
                  u"Files can be taken in only while the unread messages are shown."_s);
    };
    const Hands hands({{u"frmMessageList"_s, work}});
    frmMessageList::ShowForm();
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"a.xml b.xml c.xml c2.xml d.xml"_s);
    EXPECT_EQ(filesIn(root() + u"/stick"_s).size(), 4) << "nothing leaves the place that it comes from";
    EXPECT_TRUE(shown().starts_with("[exclamation] Not taken in:\ne.doc: "));
}

// Tests the window of the message list: folders, filter, search, load, removal, and the mouse.
#include "messagelist/MessageListModel.h"
#include "messagelist/frmMessageList.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"

struct MessageListWindow : Shop {
    /// Opens the window, does steps such as "click cmdView; key ListView1 Down; set txtFind abc; look", and closes it.
    /// Returns what each look sees: the rows (if they are few), the line under them and the controls.
    std::string visit(const QString& steps, const QByteArray& answers = R"("boxes": [])")
    {
        QJsonArray script;
        for (const QString& step : steps.split(u"; "_s)) {
            const QStringList words = step.split(u' ');
            QJsonObject done{{words[0], words.value(1)}};
            if (words[0] == u"key"_s)
                done[u"keys"_s] = QJsonArray::fromStringList(words.mid(2));
            else if (words[0] == u"set"_s)
                done[u"text"_s] = words[2];
            else if (words[0] == u"select"_s)
                done[u"item"_s] = words[2].toInt();
            else if (words[0] == u"wait"_s)
                done[u"wait"_s] = words[1].toInt();
            script.append(words[0] == u"look"_s ? QJsonObject{{u"read"_s, true}} : done);
        }
        desktop.emplace(R"({"windows": {"frmMessageList": [)" + QJsonDocument(script).toJson() +
                        R"(], "frmViewXML": [[{"read": ["txtXML"]}]]}, )" + answers + '}');
        frmMessageList::ShowForm();
        QStringList seen;
        for (const QJsonValue read : desktop->record().reads)
            if (const QJsonObject values = read[u"values"].toObject(); values.contains(u"lblStatus"_s))
                seen += look(values);
        return seen.join(u"; "_s).toStdString();
    }

    static QString look(const QJsonObject& values)
    {
        QStringList names;
        for (const QJsonValue row : values[u"ListView1"][u"rows"].toArray())
            names += row[0].toString();
        QString seen =
            (names.size() > 3 ? u"..."_s : names.join(u' ')) + u": "_s + values[u"lblStatus"][u"text"].toString();
        for (const QString& button : {u"cmdProcess"_s, u"cmdPrint"_s, u"cmdHeld"_s})
            if (const QJsonValue state = values[button]; state[u"visible"].toBool())
                seen += state[u"enabled"].toBool() ? u' ' + button : u" ("_s + button + u')';
        return values[u"Frame2"][u"visible"].toBool() ? seen + u" ["_s + values[u"txtFilter"][u"text"].toString() + u']'
                                                      : seen;
    }

    /// Opens the window on three messages and works with it.
    void work(const Hands::Work& work)
    {
        for (const char* name : {"a", "b", "c"})
            arrive(std::string(name) + ".xml", cancellation(name));
        const Hands hands({{u"frmMessageList"_s, work}});
        frmMessageList::ShowForm();
    }
};

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
    arrive("m.xml", cancellation("QR1"));
    arrive("m2.xml", cancellation("QR1"));
    for (const auto& [file, more, reason] : casesIn<3>("messages/answers.txt")) {
        arrive(file, submissionResponse("KQ1").text() + more);
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
    EXPECT_EQ(visit(u"look; click cmdProcess; look"_s),
              "a.xml: 1 message cmdProcess cmdHeld; b.xml: 1 message cmdProcess");
    EXPECT_EQ(shown(), "[none] Message Loaded");
}

TEST_F(MessageListWindow, F4ShowsTheMessagesThatAreHeldBack)
{
    arrive("a.xml", cancellation("QR1"));
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
    EXPECT_EQ(visit(u"click cmdProcess; wait 600; look"_s), "a.xml: 1 message cmdProcess");
    const QString unreadable = u"Message b.xml unreadable, Please contact MarlinDesk Support."_s;
    EXPECT_EQ(desktop->boxTexts().count(unreadable), 3);
    EXPECT_EQ(desktop->boxTexts().size(), 4);
    EXPECT_NE(desktop->boxTexts().value(1), unreadable) << "the refusal comes before the list is filled again";
}

TEST_F(MessageListWindow, EachFolderHasItsControls)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsReadPath + u"b.xml"_s, quoteMatch("123").text());
    EXPECT_EQ(visit(u"look; click Option1(1); look; click Option1(2); look; click cmdView; click Command6; "
                    "click Option1(0); look"_s),
              "a.xml: 1 message cmdProcess; b.xml: 1 message cmdPrint []; : No sent messages []; "
              "a.xml: 1 message cmdProcess");
    EXPECT_EQ(desktop->boxes(), QStringList()) << "View and Delete do nothing without a message";
}

TEST_F(MessageListWindow, TheFilterNarrowsTheReadMessages)
{
    for (int i = 0; i < 25; ++i)
        files::write(gsReadPath + u"%1.0_1.xml"_s.arg(100 + i), quoteMatch("123").text());
    EXPECT_EQ(visit(u"click Option1(1); look"_s), "...: 25 messages cmdPrint []");
    EXPECT_TRUE(desktop->record().inputs.isEmpty()) << "so many are listed unasked";
    files::write(gsReadPath + u"125.0_1.xml"_s, quoteMatch("123").text());
    EXPECT_EQ(visit(u"click Option1(1); look; set txtFilter 11; click Command1; look; set txtFilter 125; "
                    "key txtFilter Return; look; set txtFilter ; click Command1; look; click Option1(2); look"_s,
                    R"("inputs": [{"text": "Quote Number", "answer": "124"}])"),
              "124.0_1.xml: 1 message with \"124\" in their name cmdPrint [124]; "
              "...: 10 messages with \"11\" in their name cmdPrint [11]; "
              "125.0_1.xml: 1 message with \"125\" in their name cmdPrint [125]; ...: 26 messages cmdPrint []; "
              ": No sent messages []");
    ASSERT_EQ(desktop->record().inputs.size(), 1) << "an empty filter that was typed asks nothing";
    EXPECT_EQ(desktop->record().inputs[0][u"prompt"].toString(),
              u"Enter a Quote Number to search by (Leave blank for all quotes)"_s);
}

TEST_F(MessageListWindow, ATabletOnItsOwnDatabaseLoadsRequestsOnly)
{
    gbTabletLocal = true;
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", cancellation("QR2"));
    EXPECT_EQ(visit(u"look; key ListView1 Down; look; select ListView1 0; look"_s),
              "a.xml b.xml: 2 messages cmdProcess; a.xml b.xml: 2 messages (cmdProcess); "
              "a.xml b.xml: 2 messages cmdProcess");
    frmMessageList window;
    window.openUnread();
    EXPECT_FALSE(window.loadFile(u"b.xml"_s)) << "its button is disabled";
    EXPECT_EQ(desktop->boxes(), QStringList());
}

TEST_F(MessageListWindow, AMessageIsRemovedOnlyAfterYes)
{
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", quoteRequest("QR2"));
    EXPECT_EQ(visit(u"key ListView1 Delete; look"_s), "a.xml b.xml: 2 messages cmdProcess");
    EXPECT_EQ(desktop->boxes(), QStringList{u"critical||You are about to remove a.xml without loading into the "
                                            "system. Are you SURE ?|no"_s});
    EXPECT_EQ(visit(u"key ListView1 Delete; look"_s, R"("boxes": [{"text": "remove a.xml", "answer": "yes"}])"),
              "b.xml: 1 message cmdProcess");
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"b.xml"_s});
}

TEST_F(MessageListWindow, ADoubleClickShowsOnlyASentMessage)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsSentPath + u"s.xml"_s, sentDocument("500"));
    visit(u"doubleClick ListView1; click Option1(2)"_s);
    EXPECT_EQ(desktop->record().reads.size(), 0);
    visit(u"click Option1(2); doubleClick ListView1"_s);
    EXPECT_TRUE(desktop->read(u"txtXML"_s).toString().startsWith(u"<request>"_s));
}

TEST_F(MessageListWindow, SeveralRowsAreCopiedButOneIsLoaded)
{
    work([](QDialog& window) {
        desktop::gestures::press(window, Qt::CTRL | Qt::Key_A);
        desktop::gestures::press(window, Qt::CTRL | Qt::Key_C);
        EXPECT_EQ(QGuiApplication::clipboard()->text().count(u'\n'), 2);
        control<QAbstractButton>(window, "cmdProcess").click();
    });
    EXPECT_EQ(desktop->boxTexts().size(), 1) << "the refusal of one message";
}

TEST_F(MessageListWindow, TheNameTellsWhatHappenedWhen)
{
    work([](QDialog& window) {
        QStringList told;
        for (const char* option : {"Option1(0)", "Option1(1)", "Option1(2)"}) {
            files::write(gsReadPath + u"a.xml"_s, cancellation("QR1").text());
            files::write(gsSentPath + u"a.xml"_s, cancellation("QR1").text());
            control<QAbstractButton>(window, option).click();
            const QModelIndex name = control<QTreeView>(window, "ListView1").model()->index(0, 0);
            told << name.data(Qt::ToolTipRole).toString().section(u' ', 0, 1);
        }
        const QString today = QDate::currentDate().toString(u"dd/MM/yyyy"_s);
        EXPECT_EQ(told, (QStringList{u"a.xml\nArrived "_s + today, u"a.xml\nLoaded "_s + today,
                                     u"a.xml\nWritten "_s + today}));
    });
}

TEST_F(MessageListWindow, TheColumnsFitTheWindowUntilTheUserChoosesTheirWidth)
{
    work([](QDialog& window) {
        auto& list = control<QTreeView>(window, "ListView1");
        const auto widthAt = [&](int width) {
            window.resize(width, 500);
            desktop::gestures::settle();
            EXPECT_EQ(list.horizontalScrollBar()->maximum(), 0) << width;
            return list.header()->sectionSize(1);
        };
        const int usual = widthAt(1500);
        EXPECT_EQ(usual, desktop::pixels(3969));
        EXPECT_LT(widthAt(1000), usual);
        EXPECT_EQ(widthAt(1700), usual);
        list.header()->resizeSection(1, 333);
        EXPECT_EQ(widthAt(1600), 333);
    });
}

TEST_F(MessageListWindow, NothingMovesWhenTheFilterAppears)
{
    work([](QDialog& window) {
        const auto places = [&] {
            desktop::gestures::settle();
            QStringList all;
            for (const char* name : {"ListView1", "Frame1", "Command6", "txtFind", "cmdExit"}) {
                const auto& widget = control<QWidget>(window, name);
                all << u"%1,%2"_s.arg(widget.x()).arg(widget.y());
            }
            return all.join(u' ');
        };
        const QString before = places();
        control<QAbstractButton>(window, "Option1(1)").click();
        EXPECT_TRUE(control<QWidget>(window, "Frame2").isVisible());
        EXPECT_EQ(places(), before);
    });
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
        EXPECT_EQ(visit(u"key ListView1 %1; look; click Command6"_s.arg(keys)), (rows + u": "_s + line).toStdString());
        EXPECT_EQ(desktop->boxTexts().join(u' ').section(u' ', 5, 5), chosen) << keys;
    }
}

TEST_F(Searched, EndsWithTheFolder)
{
    files::write(gsReadPath + u"r.xml"_s, quoteRequest("QR9").text());
    EXPECT_EQ(visit(u"set txtFind abc; key frmMessageList F5; look; set txtFind zz; click cmdProcess; click cmdView; "
                    "click Option1(1); look; set txtFind zz; click cmdPrint; look"_s),
              "a.xml: 1 of 3 messages cmdProcess; r.xml: 1 message cmdPrint []; : 0 of 1 message cmdPrint []");
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

// Tests the window of the message list: folders, filter, search, load, removal, and the mouse.
#include "messagelist/MessageListModel.h"
#include "messagelist/frmMessageList.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"

struct MessageListWindow : Shop {
    /// Opens the window, does these steps of a script and closes it. Returns what was seen, as visits.txt writes it.
    QStringList visit(const QStringList& steps, const QString& answers = uR"("boxes": [])"_s)
    {
        const auto script =
            uR"({"windows": {"frmHeld": [[{"read": ["ListView1"]}, {"click": "cmdView"}]],
            "frmViewXML": [[{"read": ["txtXML"]}]], "frmMessageList": [[%1]]}, %2})"_s;
        desktop.emplace(script.arg(steps.join(u", "_s), answers).toUtf8());
        frmMessageList::ShowForm();
        QStringList seen;
        for (const QJsonValue read : desktop->record().reads) {
            const QJsonObject values = read[u"values"].toObject();
            const QJsonValue held = values[u"ListView1"][u"rows"][0];
            const QStringList other{values[u"txtXML"][u"text"].toString().section(u' ', 0, 0), held[0].toString(),
                                    held[3].toString()};
            seen += values.contains(u"lblStatus"_s) ? look(values) : u">> "_s + other.join(u' ').trimmed();
        }
        for (const QString& box : desktop->boxes())
            seen += u"! "_s + box;
        for (const QJsonValue input : desktop->record().inputs)
            seen += u"? "_s + input[u"prompt"].toString();
        return seen;
    }

    static QString look(const QJsonObject& values)
    {
        QStringList names;
        for (const QJsonValue row : values[u"ListView1"][u"rows"].toArray())
            names += row[0].toString();
        QString seen = u"> "_s + (names.size() > 3 ? u"..."_s : names.join(u' ')) + u": "_s +
                       values[u"lblStatus"][u"text"].toString();
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

struct MessageListVisit : MessageListWindow, ::testing::WithParamInterface<QString> {};

TEST_P(MessageListVisit, ShowsWhatIsWritten)
{
    quote("500").request("QR1");
    QStringList steps, expected;
    QString answers = uR"("boxes": [])"_s;
    for (const QString& line : GetParam().split(u'\n', Qt::SkipEmptyParts).sliced(1)) {
        if (line[0] == u'{') {
            steps += line;
        } else if (line[0] == u'"') {
            answers = line;
        } else if (u">!?"_s.contains(line[0])) {
            expected += line;
            steps += QStringList(line[1] == u' ' && line[0] == u'>', uR"({"read": true})"_s);
        } else if (line == "tablet"_L1) {
            gbTabletLocal = true;
        } else {
            const QStringList names = line.section(u':', 0, 0).split(u' ');
            const QString told = line.section(u':', 1).trimmed();
            const QString folder = line[0] == u'u' ? gsUnreadPath : line[0] == u'r' ? gsReadPath : gsSentPath;
            for (const QString& name : names.sliced(1))
                files::write(folder + name + u".xml"_s, told.isEmpty() ? told : Message::told(told).text());
        }
    }
    ASSERT_FALSE(expected.isEmpty());
    EXPECT_EQ(visit(steps, answers).join(u'\n'), expected.join(u'\n')) << GetParam().section(u'\n', 0, 0);
}

INSTANTIATE_TEST_SUITE_P(
    Visits, MessageListVisit,
    ::testing::ValuesIn(linesOf("messages/visits.txt").join(u'\n').split(u"== "_s, Qt::SkipEmptyParts)));

TEST_F(MessageListWindow, ATabletLoadsNoOtherMessage)
{
    gbTabletLocal = true;
    arrive("b.xml", cancellation("QR2"));
    frmMessageList window;
    window.openUnread();
    EXPECT_FALSE(window.loadFile(u"b.xml"_s)) << "its button is disabled";
    EXPECT_EQ(desktop->boxes(), QStringList());
}

TEST_F(MessageListWindow, SeveralRowsAreCopiedButOneIsLoaded)
{
    work([](QDialog& window) {
        desktop::gestures::press(window, Qt::CTRL | Qt::Key_A);
        desktop::gestures::press(window, Qt::CTRL | Qt::Key_C);
        EXPECT_EQ(QGuiApplication::clipboard()->text().count(u'\n'), 2);
        auto& load = control<QAbstractButton>(window, "cmdProcess");
        desktop::gestures::click(load, load.rect().center());
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
        const QString typed =
            uR"({"key": "ListView1", "keys": ["%1"]})"_s.arg(QString(keys).replace(u" "_s, uR"(", ")"_s));
        const QStringList seen = visit({typed, uR"({"read": true}, {"click": "Command6"})"_s});
        EXPECT_EQ(seen[0], u"> "_s + rows + u": "_s + line) << keys;
        EXPECT_EQ(desktop->boxTexts().join(u' ').section(u' ', 5, 5), chosen) << keys;
    }
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
        desktop::gestures::press(window,
                                 Qt::Key_F5);  // no longer with Ctrl, which would choose no row of the next list
    };
    const Hands hands({{u"frmMessageList"_s, work}});
    frmMessageList::ShowForm();
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"a.xml b.xml c.xml c2.xml d.xml"_s);
    EXPECT_EQ(filesIn(root() + u"/stick"_s).size(), 4) << "nothing leaves the place that it comes from";
    EXPECT_TRUE(shown().starts_with("[exclamation] Not taken in:\ne.doc: "));
}

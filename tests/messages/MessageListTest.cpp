#include "messages/frmMessageList.h"
#include "platform/desktop/Gestures.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "shell/modLoggerEx.h"
#include "support/Hands.h"
#include "support/Shop.h"

#include <QClipboard>
#include <QDropEvent>
#include <QGuiApplication>
#include <QHeaderView>
#include <QJsonObject>
#include <QLabel>
#include <QLineEdit>
#include <QMimeData>
#include <QPushButton>
#include <QTreeView>

using namespace Qt::StringLiterals;

namespace kest::test {
namespace {

class MessageListWindow : public Shop {
protected:
    /// Opens the window, carries out the steps, and closes it.
    void visit(std::initializer_list<std::string> steps, const std::string& answers = "",
               const std::string& otherWindows = "")
    {
        std::string all;
        for (const std::string& step : steps)
            all += (all.empty() ? "" : ", ") + step;
        const std::string windows = R"("windows": {"frmMessageList": [[)" + all + "]]" + otherWindows + "}";
        desktop.emplace(("{" + windows + (answers.empty() ? "" : ", ") + answers + "}").c_str());
        frmMessageList::ShowForm();
    }

    /// What the numbered reading step saw of a control.
    QJsonValue seen(int reading, const char* control, const char* what)
    {
        const QJsonObject values = desktop->record().reads.at(reading)[u"values"_s].toObject();
        return values[QString::fromLatin1(control)][QString::fromLatin1(what)];
    }

    std::string text(int reading, const char* control)
    {
        return seen(reading, control, "text").toString().toStdString();
    }

    std::string listed(int reading = 0)
    {
        QStringList names;
        for (const QJsonValue row : seen(reading, "ListView1", "rows").toArray())
            names << row[0].toString();
        return names.join(u' ').toStdString();
    }
};

// Steps of a visit.
const std::string readAll = R"({"read": ["ListView1", "cmdProcess", "cmdView", "Frame2", "txtFilter", "lblStatus"]})";

std::string click(const std::string& control)
{
    return R"({"click": ")" + control + R"("})";
}

std::string type(const std::string& control, const std::string& text)
{
    return R"({"set": ")" + control + R"(", "text": ")" + text + R"("})";
}

std::string key(const std::string& control, const std::string& name)
{
    return R"({"key": ")" + control + R"(", "keys": ")" + name + R"("})";
}

TEST_F(MessageListWindow, ALoadedMessageMakesRoomForTheNextOfItsRequest)
{
    quote("500").request("QR1").note("Active Quote Request");
    arrive("a.xml", cancellation("QR1"));
    arrive("b.xml", cancellation("QR1"));
    visit({readAll, click("cmdProcess"), readAll});

    EXPECT_EQ(listed(0), "a.xml");
    EXPECT_EQ(listed(1), "b.xml");
    EXPECT_EQ(text(1, "lblStatus"), "1 message");
    EXPECT_EQ(desktop->boxes(), QStringList{u"none||Message Loaded|ok"_s});
    EXPECT_EQ(filesIn(gsReadPath), QStringList{u"500.0_1.xml"_s});
    EXPECT_EQ(quote("500").stage(), 9);
}

TEST_F(MessageListWindow, ARefusedMessageStaysAndTheListIsFilledTwiceMore)
{
    arrive("a.xml", cancellation("QR1"));
    arrive("b.xml", "");
    visit({click("cmdProcess"), R"({"wait": 600})", readAll});

    EXPECT_EQ(listed(), "a.xml");
    const QString unreadable = u"Message b.xml unreadable, Please contact MarlinDesk Support."_s;
    const QStringList boxes = desktop->boxTexts();
    EXPECT_EQ(boxes.count(unreadable), 3);
    EXPECT_EQ(boxes.size(), 4);
    EXPECT_NE(boxes.value(1), unreadable) << "the refusal comes before the list is filled again";
}

TEST_F(MessageListWindow, EachFolderHasItsControls)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsReadPath + u"b.xml"_s, quoteMatch("123").text());
    visit({readAll, click("Option1(1)"), readAll, click("Option1(2)"), readAll, click("cmdView"), click("Command6"),
           click("Option1(0)"), readAll});

    const auto shows = [this](int reading) {
        return listed(reading) + (seen(reading, "cmdProcess", "visible").toBool() ? " Load" : "") +
               (seen(reading, "Frame2", "visible").toBool() ? " Filter" : "");
    };
    EXPECT_EQ(shows(0), "a.xml Load");
    EXPECT_EQ(shows(1), "b.xml Filter");
    EXPECT_EQ(shows(2), " Filter");
    EXPECT_EQ(shows(3), "a.xml Load");
    EXPECT_EQ(text(2, "lblStatus"), "No sent messages");
    EXPECT_EQ(desktop->boxes(), QStringList()) << "View and Delete do nothing without a message";
}

TEST_F(MessageListWindow, TheFilterNarrowsTheReadMessages)
{
    for (int i = 0; i < 26; ++i)
        files::write(gsReadPath + u"%1.0_1.xml"_s.arg(100 + i), quoteMatch("123").text());
    visit({click("Option1(1)"), readAll, type("txtFilter", "10"), click("Command1"), readAll, type("txtFilter", "125"),
           key("txtFilter", "Return"), readAll, type("txtFilter", ""), click("Command1"), readAll, click("Option1(2)"),
           readAll},
          R"("inputs": [{"text": "Quote Number", "answer": "124"}])");

    EXPECT_EQ(listed(0), "124.0_1.xml");
    EXPECT_EQ(text(0, "txtFilter"), "124") << "the answer to the prompt";
    EXPECT_EQ(seen(1, "ListView1", "rows").toArray().size(), 11) << "100 to 109, and 110";
    EXPECT_EQ(listed(2), "125.0_1.xml");
    EXPECT_EQ(text(2, "lblStatus"), "1 message with \"125\" in their name");
    EXPECT_EQ(seen(3, "ListView1", "rows").toArray().size(), 26);
    EXPECT_EQ(desktop->prompts().size(), 1) << "an empty filter that was typed asks nothing";
    EXPECT_EQ(text(4, "txtFilter"), "") << "another folder begins without a filter";
}

TEST_F(MessageListWindow, ATabletOnItsOwnDatabaseLoadsRequestsOnly)
{
    gbTabletLocal = true;
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", cancellation("QR2"));
    visit({readAll, key("ListView1", "Down"), readAll, R"({"select": "ListView1", "item": 0})", readAll});
    EXPECT_TRUE(seen(0, "cmdProcess", "enabled").toBool());
    EXPECT_FALSE(seen(1, "cmdProcess", "enabled").toBool());
    EXPECT_TRUE(seen(2, "cmdProcess", "enabled").toBool());

    frmMessageList window;
    window.open();
    EXPECT_FALSE(window.loadFile(u"b.xml"_s)) << "its button is disabled";
    EXPECT_EQ(desktop->boxes(), QStringList());
}

TEST_F(MessageListWindow, AMessageIsRemovedOnlyAfterYes)
{
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", quoteRequest("QR2"));
    visit({key("ListView1", "Delete"), readAll});
    EXPECT_EQ(listed(), "a.xml b.xml");
    EXPECT_EQ(desktop->boxes(), QStringList{u"critical||You are about to remove a.xml without loading into the "
                                            "system. Are you SURE ?|no"_s});
    visit({key("ListView1", "Delete"), readAll}, R"("boxes": [{"text": "remove a.xml", "answer": "yes"}])");
    EXPECT_EQ(listed(), "b.xml");
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList{u"b.xml"_s});
}

TEST_F(MessageListWindow, ADoubleClickShowsASentMessageAndNoOther)
{
    arrive("a.xml", quoteRequest("QR1"));
    files::write(gsSentPath + u"s.xml"_s, sentDocument("500"));
    const char* doubleClick = R"({"doubleClick": "ListView1"})";
    visit({doubleClick, click("Option1(2)")});  // a viewer that opens now ends the run
    visit({click("Option1(2)"), doubleClick}, "", R"(, "frmViewXML": [[{"read": ["txtXML"]}]])");
    EXPECT_TRUE(text(0, "txtXML").starts_with("<request>"));
}

TEST_F(MessageListWindow, TheLineUnderTheListNamesTheFileThatEndedTheFill)
{
    arrive("a.xml", quoteRequest("QR1"));
    arrive("R_500_0.xml", submissionResponse("KQ1"));
    visit({readAll});
    EXPECT_EQ(listed(), "");
    EXPECT_NE(text(0, "lblStatus").find("R_500_0.xml"), std::string::npos) << text(0, "lblStatus");
    quote("500");
    visit({readAll});
    EXPECT_EQ(listed(), "a.xml");
    EXPECT_EQ(quote("500").text("KESTQuoteNo"), "KQ1");
    gsUnreadPath = u"c:\\gone\\"_s;
    visit({readAll});
    EXPECT_NE(text(0, "lblStatus").find("c:\\gone\\"), std::string::npos);
    EXPECT_EQ(desktop->boxes(), QStringList());
}

TEST_F(MessageListWindow, TheFirstRowShownIsChosenWhateverTheOrder)
{
    gbTabletLocal = true;
    arrive("a.xml", cancellation("QR2"));
    arrive("b10.xml", quoteRequest("QR1"));
    arrive("b9.xml", quoteRequest("QR3"));
    visit({key("frmMessageList", "F5"), readAll});
    EXPECT_EQ(listed(), "a.xml b10.xml b9.xml");

    frmMessageList window;
    auto* list = window.findChild<QTreeView*>();
    list->sortByColumn(0, Qt::DescendingOrder);
    window.open();
    EXPECT_EQ(list->model()->index(0, 0).data(), u"b10.xml"_s);
    EXPECT_EQ(list->currentIndex().row(), 0);
    EXPECT_TRUE(window.findChild<QPushButton*>(u"cmdProcess"_s)->isEnabled()) << "as if it had been clicked";
}

// Three messages of which the search tells one from the others in every way.
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
    struct {
        const char* keys;
        const char* rows;
        const char* line;
        const char* chosen;  // what "Load" asks for then
    } const cases[] = {
        {R"("X", "Y")", "b.xml", "1 of 3 messages", "b.xml"},
        {R"("H", "O", "L", "L")", "b.xml", "1 of 3 messages", "b.xml"},
        {R"("R", "E", "Q", "U", "E", "S", "T", "Down")", "a.xml b.xml c.xml", "3 of 3 messages", "b.xml"},
        {R"("Q", "U", "O", "T", "E", " ", "R", "Down")", "a.xml b.xml c.xml", "3 of 3 messages", "b.xml"},
        {R"("Z", "Z")", "", "0 of 3 messages", ""},
        {R"("Z", "Z", "Backspace", "Backspace", "T", "A", "R", "R")", "a.xml", "1 of 3 messages", "a.xml"},
        {R"("X", "Y", "Escape")", "a.xml b.xml c.xml", "3 messages", "b.xml"},
    };
    for (const auto& [keys, rows, line, chosen] : cases) {
        visit({R"({"key": "ListView1", "keys": [)" + std::string(keys) + "]}", readAll, click("Command6")});
        EXPECT_EQ(listed(), rows) << keys;
        EXPECT_EQ(text(0, "lblStatus"), line) << keys;
        const QStringList asked = desktop->boxTexts();
        EXPECT_EQ(asked.join(u' ').section(u' ', 5, 5).toStdString(), chosen) << keys;
    }
}

TEST_F(Searched, OutlivesARefreshAndEndsWithTheFolder)
{
    files::write(gsReadPath + u"r.xml"_s, quoteRequest("QR9").text());
    visit({type("txtFind", "abc"), key("frmMessageList", "F5"), readAll, type("txtFind", "zz"), click("cmdProcess"),
           click("cmdView"), click("Option1(1)"), readAll, type("txtFind", "zz"), click("cmdPrint"), readAll});
    EXPECT_EQ(listed(0), "a.xml");
    EXPECT_EQ(listed(1), "r.xml");
    EXPECT_EQ(listed(2), "");
    EXPECT_EQ(desktop->boxes(), QStringList()) << "a row that is not shown is not loaded, viewed or printed";
    EXPECT_EQ(filesIn(gsUnreadPath).size(), 3);
}

TEST_F(Searched, OrderWidthsAndPlaceOutliveARefreshAndOrderAndWidthsTheWindow)
{
    const auto shownFile = [](QTreeView& list) { return list.currentIndex().siblingAtColumn(0).data().toString(); };
    const auto headers = [](QTreeView& list) {
        const QHeaderView& header = *list.header();
        return QString(u"%1 %2 %3"_s)
            .arg(header.sectionSize(2))
            .arg(header.sortIndicatorSection())
            .arg(header.sortIndicatorOrder());
    };
    const auto press = [](QWidget& window, QKeyCombination key) { desktop::gestures::press(window, key); };
    const auto work = [&](QDialog& window) {
        auto& list = control<QTreeView>(window, "ListView1");
        for (const char* first : {"a.xml", "c.xml", "a.xml", "a.xml", "c.xml"}) {  // to, fro, none, to, fro
            press(window, Qt::CTRL | Qt::Key_1);
            EXPECT_EQ(list.model()->index(0, 0).data(), QString::fromLatin1(first));
        }
        list.header()->resizeSection(2, 177);
        press(list, Qt::Key_Home);
        press(list, Qt::Key_Down);
        for (const QKeyCombination key :
             {QKeyCombination(Qt::Key_F5), Qt::CTRL | Qt::Key_3, Qt::CTRL | Qt::Key_1, Qt::CTRL | Qt::Key_1}) {
            press(window, key);
            EXPECT_EQ(shownFile(list), u"b.xml"_s) << key.toCombined();
        }
        press(window, Qt::Key_F5);
        EXPECT_EQ(headers(list), u"177 0 1"_s);
    };
    const test::Hands hands({{u"frmMessageList"_s, work}});
    frmMessageList::ShowForm();
    const test::Hands again({{u"frmMessageList"_s, [&](QDialog& window) {
                                  auto& list = control<QTreeView>(window, "ListView1");
                                  EXPECT_EQ(headers(list), u"177 0 1"_s);
                                  EXPECT_EQ(shownFile(list), u"c.xml"_s) << "the first row of that order";
                              }}});
    frmMessageList::ShowForm();
}

/// Files on a stick, as a mouse or the clipboard brings them.
std::unique_ptr<QMimeData> stick(const QString& root, std::initializer_list<std::pair<QString, QString>> files)
{
    QList<QUrl> urls;
    for (const auto& [name, content] : files) {
        files::makeFolder(root + u"/stick"_s);
        files::write(root + u"/stick/"_s + name, content);
        urls.append(QUrl::fromLocalFile(root + u"/stick/"_s + name));
    }
    auto data = std::make_unique<QMimeData>();
    data->setUrls(urls);
    return data;
}

TEST_F(Searched, FilesAreDroppedOrPastedWhileTheUnreadMessagesAreShown)
{
    const auto drop = [](QDialog& window, const QMimeData& data) {
        QWidget& list = *control<QTreeView>(window, "ListView1").viewport();
        QDragEnterEvent enters(QPoint(9, 9), Qt::MoveAction | Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QCoreApplication::sendEvent(&list, &enters);
        if (!enters.isAccepted())
            return false;
        QDropEvent drops(QPoint(9, 9), Qt::MoveAction | Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QCoreApplication::sendEvent(&list, &drops);
        EXPECT_EQ(drops.dropAction(), Qt::CopyAction);
        desktop::gestures::settle();
        return true;
    };
    const auto paste = [](QDialog& window, std::unique_ptr<QMimeData> data) {
        QGuiApplication::clipboard()->setMimeData(data.release());
        desktop::gestures::press(window, Qt::CTRL | Qt::Key_V);
        return control<QLabel>(window, "lblStatus").text();
    };
    const test::Hands hands(
        {{u"frmMessageList"_s, [&](QDialog& window) {
              EXPECT_TRUE(drop(window, *stick(root(), {{u"d.xml"_s, cancellation("QR4").text()}, {u"e.doc"_s, {}}})));
              EXPECT_EQ(control<QLabel>(window, "lblStatus").text(), u"Taken in: 1 message. 4 messages"_s);
              EXPECT_EQ(paste(window, stick(root(), {{u"QR1_001.jpg"_s, {}}})), u"Taken in: 1 picture. 4 messages"_s);
              EXPECT_EQ(paste(window, stick(root(), {{u"c2.xml"_s, cancellation("QR3").text()}})),
                        u"Taken in: 1 message. 1 not listed yet: held back by missing pictures or an earlier message. "
                        "4 messages"_s);
              EXPECT_EQ(paste(window, std::make_unique<QMimeData>()), u"The clipboard holds no files."_s);
              control<QAbstractButton>(window, "Option1(1)").click();
              EXPECT_FALSE(drop(window, *stick(root(), {{u"f.xml"_s, cancellation("QR5").text()}})));
              EXPECT_EQ(paste(window, stick(root(), {{u"f.xml"_s, cancellation("QR5").text()}})),
                        u"Files are taken in while the unread messages are shown."_s);
          }}});
    frmMessageList::ShowForm();
    EXPECT_EQ(filesIn(gsUnreadPath).join(u' '), u"a.xml b.xml c.xml c2.xml d.xml QR1_001.jpg"_s);
    EXPECT_EQ(filesIn(root() + u"/stick"_s).size(), 5) << "nothing leaves the place that it comes from";
    EXPECT_EQ(shown(),
              "[exclamation] Not taken in:\n"
              "e.doc: it is no message, picture (.jpg) or description (.txt)");
}

TEST_F(MessageListWindow, AFileThatHasGoneOrLiesElsewhereIsNotLoaded)
{
    frmMessageList window;
    window.open();
    EXPECT_FALSE(window.loadFile(u"gone.xml"_s));
    EXPECT_TRUE(files::read(ErrorLogPath()).contains(u"frmMessageList.cmdProcess_Click"_s));
    files::write(gsReadPath + u"notice.xml"_s, marker("500"));
    EXPECT_FALSE(window.loadFile(u"../ARead/notice.xml"_s));
    EXPECT_TRUE(files::waitForBackground(5000));
    EXPECT_EQ(filesIn(gsReadPath), QStringList{u"notice.xml"_s});
}

}  // namespace
}  // namespace kest::test

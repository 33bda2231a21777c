// The text viewer: what a save writes, what stops it, and leaving with unsaved typing.
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"
#include "utilities/ExactTextEdit.h"
#include "utilities/frmLogin.h"
#include "utilities/frmViewXML.h"

#include <QLineEdit>
#include <QPushButton>

namespace kest {

using namespace Qt::StringLiterals;
using test::ScriptedDesktop;
using test::TestProfile;

namespace {

const QString file = u"m.xml"_s;

class Viewer : public ::testing::Test {
protected:
    Viewer()
    {
        gsCurFolder = u"c:\\wirdoc\\AUnread\\"_s;
        files::makeFolder(gsCurFolder);
    }
    ~Viewer() override { gsCurFolder.clear(); }

    /// Opens the viewer on the content and works it; the boxes that came.
    static QStringList view(const QByteArray& content, const std::string& steps, const std::string& answers = {},
                            const std::string& password = std::to_string(DayPassword(QDate::currentDate())))
    {
        files::writeBytes(gsCurFolder + file, content);
        ScriptedDesktop desk(("{\"boxes\": [" + answers + "], \"windows\": {\"frmViewXML\": [[" + steps +
                              R"(]], "frmLogin": [[{"set": "txtPassword", "text": ")" + password +
                              R"("}, {"click": "cmdOK"}]]}})")
                                 .c_str());
        frmViewXML::ShowForm(file);
        const QString position = desk.read(u"lblPosition"_s).toString();
        shown = position.isEmpty() ? desk.read(u"txtXML"_s).toString() : position;
        return desk.boxTexts();
    }
    static QByteArray written() { return files::readBytes(gsCurFolder + file); }

    TestProfile profile;
    static inline QString shown;
};

const std::string save = R"({"click": "Command2"})";
const QString overwrite = u"Are you sure you want to OVERWRITE this message?"_s;
const QString leave = u"Are you sure you want to exit without saving this message?"_s;

}  // namespace

TEST_F(Viewer, ASaveWritesTheTextWithoutTheWrapperAndWithTheCharactersThemselves)
{
    const QByteArray longValue(3'000'000, 'Q');  // a document in base64
    const std::pair<QByteArray, QByteArray> cases[] = {
        {"<a><b>1</b></a>", "<a>\r\n\t<b>1</b>\r\n</a>\r\n"},
        {"<a>1</a><b>2</b>", "\r\n\t<a>1</a>\r\n\t<b>2</b>\r\n"},
        {"<request><a>1</a></request>", "\r\n\t<a>1</a>\r\n"},
        {"<a>Smith & Co</a>", "<a>Smith & Co</a>\r\n"},
        {"<a>&lt;b&gt; &amp;amp; &amp;lt; &amp;amp;lt;</a>", "<a><b> & < &lt;</a>\r\n"},
        {"<a>caf\xe9\xa0\x80 one\ntwo</a>", "<a>caf\xe9\xa0\x80 one\ntwo</a>\r\n"},
        {"<a><pdf>" + longValue + "</pdf></a>", "<a>\r\n\t<pdf>" + longValue + "</pdf>\r\n</a>\r\n"},
    };
    for (const auto& [content, expected] : cases) {
        EXPECT_EQ(view(content, save), QStringList(overwrite));
        EXPECT_TRUE(written() == expected) << written().left(100).toStdString();
    }
}

TEST_F(Viewer, WhatWasTypedIsWritten)
{
    view("<a>1</a>", R"({"set": "txtXML", "text": "<a>\n2</a>"}, )" + save);
    EXPECT_EQ(written(), "<a>\r\n2</a>");
}

TEST_F(Viewer, NothingIsWrittenWithoutThePasswordOrTheYes)
{
    const std::string readToo = save + R"(, {"read": "txtXML"})";
    EXPECT_EQ(view("<a>1</a>", readToo, R"({"text": "OVERWRITE", "answer": "no"})"), QStringList(overwrite));
    EXPECT_EQ(written(), "<a>1</a>");
    EXPECT_EQ(shown, u"<a>1</a>\r\n"_s);
    EXPECT_EQ(view("<a>1</a>", readToo, {}, "1"), QStringList(u"Invalid Password, try again!"_s));
    EXPECT_EQ(written(), "<a>1</a>");
}

TEST_F(Viewer, ASaveBringsBackAFileThatHasGoneAndReplacesOneThatHasChanged)
{
    const std::function<void()> meanwhile[] = {
        [] { files::remove(gsCurFolder + file); },
        [] { files::writeBytes(gsCurFolder + file, "<b/>"); },
    };
    for (const auto& change : meanwhile) {
        const ScriptedDesktop desk;
        const test::Hands hands(
            {{u"frmViewXML"_s,
              [&](QDialog& window) {
                  change();
                  test::control<QPushButton>(window, "Command2").click();
              }},
             {u"frmLogin"_s, [](QDialog& window) {
                  const qint64 password = DayPassword(QDate::currentDate());
                  test::control<QLineEdit>(window, "txtPassword").setText(QString::number(password));
                  test::control<QPushButton>(window, "cmdOK").click();
              }}});
        files::writeBytes(gsCurFolder + file, "<a>1</a>");
        frmViewXML::ShowForm(file);
        EXPECT_EQ(written(), "<a>1</a>\r\n");
    }
}

TEST_F(Viewer, LeavingWithUnsavedTypingIsAskedAbout)
{
    const std::string type = R"({"key": "txtXML", "keys": "x"}, )";
    EXPECT_EQ(view("<a/>", R"({"click": "Command1"})"), QStringList());
    EXPECT_EQ(view("<a/>", R"({"key": "txtXML", "keys": "Escape"})"), QStringList());
    EXPECT_EQ(view("<a/>", type + R"({"click": "Command1"})"), QStringList(leave));
    EXPECT_THROW(view("<a/>", type + R"({"click": "Command1"}, {"read": "txtXML"})",
                      R"({"text": "exit without saving", "answer": "no"})"),
                 desktop::NeedsAnswer)
        << "No keeps the window, which the end of the script then can't close";
    EXPECT_EQ(written(), "<a/>");
}

TEST_F(Viewer, AFindGoesRoundTheTextAndIsNoTyping)
{
    const QByteArray content = "<a><b>1</b><b>2</b></a>";
    const std::pair<std::string, QString> cases[] = {
        {R"("Return")", u"Line 2, column 5"_s},
        {R"("Return", "Return", "Return")", u"Line 2, column 5"_s},
        {R"("Return", "F3")", u"Line 3, column 5"_s},
        {R"("Shift+F3")", u"Line 3, column 5"_s},
    };
    for (const auto& [keys, place] : cases) {
        const std::string steps = R"({"key": "txtXML", "keys": "Ctrl+F"}, {"set": "txtFind", "text": "<b>"},
            {"key": "txtFind", "keys": [)" +
                                  keys + R"(]}, {"read": "lblPosition"}, {"click": "Command1"})";
        EXPECT_EQ(view(content, steps), QStringList()) << keys;
        EXPECT_EQ(shown, place) << keys;
    }
    EXPECT_EQ(view(content, R"({"set": "txtFind", "text": "x"}, {"key": "txtFind", "keys": "Return"},
                               {"read": "lblPosition"})"),
              QStringList());
    EXPECT_EQ(shown, u"Not found"_s);
}

TEST(ExactText, ComesBackAsItWasGivenAndAsItWasEdited)
{
    const QString longLine(10'000, u'Q');
    const QString texts[] = {
        {},
        u"one"_s,
        u"\r\n"_s,
        u"a\r\nb\nc\rd\r\n\r\n\n"_s,
        u"a\u00a0b\u2029c\ufdd0d\u2028e"_s,
        longLine,
        longLine + u"\r\n\t"_s + longLine + u'\n',
    };
    ExactTextEdit edit;
    for (const QString& text : texts) {
        edit.setExactText(text);
        EXPECT_TRUE(edit.exactText() == text) << text.left(40).toStdString();
    }

    edit.setExactText(longLine);  // shown in pieces
    QTextCursor cursor(edit.document());
    cursor.setPosition(4000);
    cursor.insertBlock();
    EXPECT_TRUE(edit.exactText() == longLine.left(4000) + u"\r\n"_s + longLine.mid(4000));
    edit.undo();
    cursor.setPosition(6000);
    cursor.insertText(u"1\n2\n3"_s);
    EXPECT_TRUE(edit.exactText() == longLine.left(5999) + u"1\r\n2\r\n3"_s + longLine.mid(5999));
    edit.undo();
    cursor.setPosition(3990);
    cursor.setPosition(4010, QTextCursor::KeepAnchor);
    cursor.removeSelectedText();
    EXPECT_TRUE(edit.exactText() == longLine.mid(19));
    edit.undo();
    EXPECT_TRUE(edit.exactText() == longLine);
}

}  // namespace kest

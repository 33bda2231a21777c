// Tests the text viewer: what a save writes, what prevents it, and closing with unsaved changes.
#include "base/SharedVariables.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"
#include "utilities/ExactTextEdit.h"
#include "utilities/frmLogin.h"
#include "utilities/frmViewXML.h"

const QString file = u"m.xml"_s;

struct Viewer : ::testing::Test {
    Viewer()
    {
        gsCurFolder = u"c:\\wirdoc\\AUnread\\"_s;
        files::makeFolder(gsCurFolder);
    }
    ~Viewer() override { gsCurFolder.clear(); }

    /// Opens the viewer with the content, does the steps and returns the boxes.
    static QStringList view(const QByteArray& content, const std::string& steps, const std::string& answers = {},
                            const std::string& password = std::to_string(dayPassword(QDate::currentDate())))
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

TEST_F(Viewer, AVisitEndsAsTheTableSays)
{
    QGuiApplication::clipboard()->setText(u"pasted"_s);
    for (const QStringList& row : rowsIn("utilities-visits.txt")) {
        QStringList boxes;
        try {
            boxes = view(row[0].toLatin1(), row[1].toStdString(), row[2].toStdString());
        } catch (const desktop::NeedsAnswer&) {
            boxes = QStringList(u"cannot go on"_s);
        }
        EXPECT_EQ(boxes.join(u'|'), row[3]) << row[0] << row[1];
        EXPECT_EQ(written(), row[4].toLatin1()) << row[1];
    }
    const QByteArray longValue(3'000'000, 'Q');  // a base64 document
    view("<a><pdf>" + longValue + "</pdf></a>", save);
    EXPECT_TRUE(written() == "<a>\r\n\t<pdf>" + longValue + "</pdf>\r\n</a>\r\n") << written().left(100).toStdString();
}

TEST_F(Viewer, NothingIsWrittenWithoutThePassword)
{
    EXPECT_EQ(view("<a>1</a>", save + R"(, {"read": "txtXML"})", {}, "1"),
              QStringList(u"Invalid Password, try again!"_s));
    EXPECT_EQ(written(), "<a>1</a>");
    EXPECT_EQ(shown, u"<a>1</a>\r\n"_s);
}

TEST_F(Viewer, AFileThatIsGoneIsNotCalledCorrupt)
{
    ScriptedDesktop desk(R"({"windows": {"frmViewXML": [[]]}})");
    frmViewXML::ShowForm(u"gone.xml"_s);
    EXPECT_EQ(desk.boxTexts(), QStringList(u"The file c:\\wirdoc\\AUnread\\gone.xml is no longer there."_s));
}

TEST_F(Viewer, AFindGoesRoundTheText)
{
    for (const auto& [wanted, keys, place] : casesIn<3>("utilities-find.txt")) {
        const QString find =
            uR"({"key": "txtXML", "keys": "Ctrl+F"}, {"set": "txtFind", "text": "%1"},
                                 {"key": "txtFind", "keys": ["%2"]}, {"read": "lblPosition"})"_s.arg(
                wanted, QString(keys).replace(u" "_s, u"\", \""_s));
        EXPECT_EQ(view("<a><b>1</b><b>2</b></a>", find.toStdString()), QStringList()) << keys;
        EXPECT_EQ(shown, place) << keys;
    }
}

TEST(ExactText, ComesBackToTheCharacter)
{
    const QString longLine(10'000, u'Q');
    ExactTextEdit edit;
    for (const QString& text : {QString(), u"\r\n"_s, u"a\r\nb\nc\rd\r\n\r\n\n"_s, u"a\u00a0b\u2029c\ufdd0d\u2028e"_s,
                                longLine + u"\r\n\t"_s + longLine + u'\n'}) {
        edit.setExactText(text);
        EXPECT_TRUE(edit.exactText() == text) << text.left(40);
    }

    // replaces the text between two positions, in the editor and in the text itself
    const QString text = u"a\nb\r\n"_s + longLine;  // shown in pieces from 5, 4005 and 8005
    const std::tuple<int, int, QString, QString> edits[] = {
        // start and length in the shown text
        {1, 0, u"\n"_s, u"a\r\n\nb\r\n"_s + longLine},
        {0, 2, u"1\n2"_s, u"1\r\n2b\r\n"_s + longLine},
        {4, 4001, {}, u"a\nb\r\n"_s + longLine.mid(4000)},
        {3, 1, {}, u"a\nb"_s + longLine},
        {3990, 20, {}, u"a\nb\r\n"_s + longLine.mid(19)},
        {4004, 0, u"\n"_s, u"a\nb\r\n"_s + longLine.left(4000) + u"\r\n"_s + longLine.mid(4000)}};
    edit.setExactText(text);
    for (const auto& [start, length, typed, expected] : edits) {
        QTextCursor cursor(edit.document());
        cursor.setPosition(start);
        cursor.setPosition(start + length, QTextCursor::KeepAnchor);
        cursor.insertText(typed);
        EXPECT_TRUE(edit.exactText() == expected) << start;
        edit.undo();
        EXPECT_TRUE(edit.exactText() == text) << start;
    }
    edit.selectAll();
    edit.copy();
    EXPECT_TRUE(QGuiApplication::clipboard()->text() == text);
    QGuiApplication::clipboard()->setText(u"1\u20282"_s);
    edit.paste();
    QKeyEvent key(QEvent::KeyPress, Qt::Key_Return, Qt::ShiftModifier, u"\r"_s);
    QCoreApplication::sendEvent(&edit, &key);
    EXPECT_EQ(edit.exactText(), u"1\r\n2\r\n"_s) << "no line ends but the usual ones are put in";
}

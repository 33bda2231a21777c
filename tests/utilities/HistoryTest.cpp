// The history window answers what a service person asks first: who changed this, and from what to what?
#include "base/Journal.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"
#include "utilities/frmUtilities.h"

namespace gestures = desktop::gestures;

struct History : Shop {
    History()
    {
        quote("500").set("excess", 250).claim("C1");
        quote("500", 1).set("excess", 10);
        quote("501").set("excess", 1);
    }

    static void change(const char* file, const QStringList& assignments, const char* where)
    {
        journal::Operation operation(journal::Kind::Load, QString::fromLatin1(file));
        for (const QString& assignment : assignments)
            gConn->execute(u"UPDATE QUOTE1 SET "_s + assignment + u" WHERE "_s + QString::fromLatin1(where));
        operation.end(journal::State::Done);
    }

    /// Opens the window from the utilities of quote 500 and operates it. Stores the claim that the utilities show then.
    void open(const test::Hands::Work& work, const frmHistory::Undo& undo = {})
    {
        int seen = 0;
        const test::Hands hands({{u"frmUtilities"_s,
                                  [&](QDialog& window) {
                                      control<QPushButton>(window, "cmdHistory").click();
                                      claim = window.isVisible() ? control<QLineEdit>(window, "txtClaimNo").text()
                                                                 : u"closed"_s;
                                  }},
                                 {u"frmHistory"_s, [&](QDialog& window) {
                                      ++seen;
                                      work(window);
                                  }}});
        frmUtilities::ShowForm(u"500"_s, u"0"_s, undo);
        EXPECT_EQ(seen, 1);
    }

    /// Returns the visible texts of some columns, a line for each row.
    static std::string rows(QDialog& window, const char* list, std::initializer_list<int> columns)
    {
        QString told;
        const auto shown = QTreeWidgetItemIterator::NotHidden;
        for (QTreeWidgetItemIterator row(&control<QTreeWidget>(window, list), shown); *row; ++row) {
            QStringList cells;
            for (const int column : columns)
                cells.append((*row)->text(column));
            told += cells.join(u' ').toUpper() + u'\n';
        }
        return told.toStdString();
    }
    static std::string operations(QDialog& window) { return rows(window, "ListView1", {3, 4}); }
    static std::string changes(QDialog& window) { return rows(window, "ListView2", {0, 1, 3, 4, 5}); }
    QString claim;
    static std::string status(QDialog& window) { return control<QLabel>(window, "lblStatus").text().toStdString(); }
};

TEST_F(History, FindsWhoChangedAColumnFromWhatToWhat)
{
    change("a.xml", {u"excess=400"_s, u"CLAIM='C2'"_s}, "QTNNO='500' AND SUBQUOTE='0'");
    change("b.xml", {u"CLAIM='C3'"_s}, "QTNNO='500' AND SUBQUOTE='0'");
    change("c.xml", {u"CLAIM='C4'"_s}, "QTNNO='500' AND SUBQUOTE='1'");
    change("d.xml", {u"excess=2"_s}, "QTNNO='501'");
    open([](QDialog& window) {
        for (const auto& [typed, found, changed, line] : casesIn<4>("utilities-history.txt")) {
            control<QLineEdit>(window, "txtFind").setText(typed);
            EXPECT_EQ(QString::fromStdString(operations(window)).replace(u'\n', u';'), found) << typed;
            EXPECT_EQ(QString::fromStdString(changes(window)).replace(u'\n', u';'), changed) << typed;
            EXPECT_EQ(status(window), line.toStdString()) << typed;
            dropConnection();
        }
    });
}

TEST_F(History, SortsTheListThatHasTheFocus)
{
    for (int number = 1; number <= 10; ++number)  // as texts, 10 would come before 9
        change(number == 1 ? "a.xml" : "b.xml", {u"CLAIM='N%1', excess=%1"_s.arg(number)}, "QTNNO='500'");
    open([](QDialog& window) {
        const auto first = [&] { return operations(window).substr(0, 18); };
        control<QTreeWidget>(window, "ListView1").setFocus();
        for (const auto key : {Qt::Key_1, Qt::Key_2}) {
            gestures::press(window, Qt::CTRL | key);
            EXPECT_EQ(first(), "LOAD OF A.XML DONE");
            gestures::press(window, Qt::CTRL | key);
            EXPECT_EQ(first(), "LOAD OF B.XML DONE");
        }
        const std::string before = changes(window);
        control<QTreeWidget>(window, "ListView2").setFocus();
        gestures::press(window, Qt::CTRL | Qt::Key_4);
        gestures::press(window, Qt::CTRL | Qt::Key_4);
        EXPECT_EQ(first(), "LOAD OF B.XML DONE");
        EXPECT_NE(changes(window), before);
    });
}

TEST_F(History, UndoesTheChosenLoad)
{
    change("a.xml", {u"CLAIM='C2'"_s}, "QTNNO='500'");
    open([](QDialog& window) { EXPECT_FALSE(control<QPushButton>(window, "cmdUndo").isVisible()); });
    const auto undo = [](const QString& statement, bool fails) {
        return [statement, fails](qint64 operation) {
            EXPECT_EQ(operation, 1);
            if (statement.isEmpty())
                return false;
            gConn->execute(statement);
            gConn->execute(u"UPDATE KESTOperation SET State='taken back'"_s);
            if (fails)
                throw RuntimeError(StatementFailed, u"half done"_s);
            return true;
        };
    };
    const auto press = [](QDialog& window) {
        gestures::press(window, Qt::ALT | Qt::Key_U);
        EXPECT_EQ(rowCount("KESTOperation", "State='done'") == 1, operations(window) == "LOAD OF A.XML DONE\n");
    };
    const std::tuple<QString, bool, QString> cases[] = {
        {{}, false, u"C2"_s},
        {u"UPDATE QUOTE1 SET CLAIM='C3' WHERE QTNNO='500'"_s, true, u"C3"_s},
        {u"DELETE FROM QUOTE1 WHERE QTNNO='500'"_s, false, u"closed"_s},
    };
    for (const auto& [statement, fails, expected] : cases) {
        open(press, undo(statement, fails));
        EXPECT_EQ(claim, expected);
    }
    EXPECT_TRUE(shown().ends_with("half done\n[information] Quote 500/0 no longer exists."));
}

TEST_F(History, IsShownAgainIfTheConnectionIsLostInABoxOfTheUndo)
{
    change("a.xml", {u"CLAIM='C2'"_s}, "QTNNO='500'");
    const auto press = [](QDialog& window) {
        gestures::press(window, Qt::ALT | Qt::Key_U);
        EXPECT_EQ(operations(window), "LOAD OF A.XML DONE\n");
    };
    open(press, [](qint64) {
        dropConnection();
        return true;
    });
    EXPECT_EQ(shown(), "");
}

TEST_F(History, SaysWhyItIsEmpty)
{
    open([](QDialog& window) { EXPECT_EQ(status(window), "Nothing is recorded for quote 500."); });
}

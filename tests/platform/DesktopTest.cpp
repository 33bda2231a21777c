// Tests boxes, input boxes, starting programs, the guard of window events, and the remembered window layout.
#include "platform/Prompt.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/Person.h"
#include "platform/desktop/Progress.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"

using desktop::Answer;
using desktop::Icon;

TEST(Seam, TheScriptAnswersByTheFirstEntryThatFits)
{
    const ScriptedDesktop desk(R"({
        "boxes": [ {"text": "SURE", "answer": "yes"}, {"text": "SURE ?", "answer": "no"}, {"text": "!", "answer": "ok"},
                   {"text": "Loaded", "answer": "yes"} ],
        "inputs": [ {"text": "filter", "answer": "abc"} ] })");
    for (int time = 0; time < 2; ++time)
        EXPECT_TRUE(desktop::ask(u"Are you SURE ?"_s, Icon::Critical, {}, Answer::No)) << "entries are not used up";
    EXPECT_FALSE(desktop::ask(u"Overwrite?"_s, Icon::Exclamation, u"Login"_s, Answer::No));
    EXPECT_TRUE(desktop::ask(u"Go on?"_s));
    desktop::msgBox(u"Message Sent"_s);
    EXPECT_EQ(desktop::inputBox(u"Enter a filter"_s, u"List"_s), u"abc"_s);
    EXPECT_EQ(desktop::inputBox(u"Enter a name"_s, {}), QString());
    EXPECT_THROW(desktop::msgBox(u"Message Loaded"_s), desktop::NeedsAnswer) << "no answer that the box offers";
    EXPECT_THROW(desktop::ask(u"Go on!"_s), desktop::NeedsAnswer);

    const auto json = [](const QJsonValue& entry) {
        return QJsonDocument(entry.toObject()).toJson(QJsonDocument::Compact);
    };
    EXPECT_EQ(desk.boxes().join(u'\n'),
              u"critical||Are you SURE ?|yes\ncritical||Are you SURE ?|yes\nexclamation|Login|Overwrite?|no\n"
              "question||Go on?|yes\nnone||Message Sent|ok"_s);
    EXPECT_EQ(
        json(desk.record().boxes[2]),
        R"({"answer":"no","buttons":"yesno","default":"no","icon":"exclamation","text":"Overwrite?","title":"Login"})");
    EXPECT_EQ(json(desk.record().inputs[0]), R"({"answer":"abc","prompt":"Enter a filter","title":"List"})");
}

TEST(Seam, AProgramIsStartedUnderItsHostName)
{
    const TestProfile profile;
    const ScriptedDesktop desk;
    const QString trace = profile.root() + u"/started"_s;
    files::write(u"c:\\KESTWeb.exe"_s,
                 u"#!/bin/sh\nprintf %s \"$KEST2_PROFILE\" > '%1.new' && mv '%1.new' '%1'\n"_s.arg(trace));
    QFile program(profile.driveC() + u"/KESTWeb.exe"_s);
    EXPECT_THROW(desktop::startProgram(u"c:\\KESTWeb.exe"_s), RuntimeError) << "not marked as a program";
    program.setPermissions(program.permissions() | QFile::ExeOwner);
    desktop::startProgram(u"C:\\kestweb.EXE"_s);
    for (int waited = 0; !files::exists(trace) && waited < 5000; waited += 10)
        QThread::msleep(10);
    EXPECT_EQ(files::read(trace), profile.root()) << "it works on the profile of who started it";
    EXPECT_THROW(desktop::startProgram(u"c:\\missing.exe"_s), RuntimeError);
}

struct Person : testing::Test {
    Person() { desktop::usePerson(); }
    ~Person() override { desktop::useScript(nullptr); }
    TestProfile profile;
};

TEST_F(Person, AnswersQuestionsByKey)
{
    for (const auto& [preset, key, yes] :
         {std::tuple(Answer::Yes, Qt::Key_Return, true), std::tuple(Answer::No, Qt::Key_Return, false),
          std::tuple(Answer::Yes, Qt::Key_Escape, false)}) {
        whenShown<QMessageBox>([&](QMessageBox& box) {
            desktop::gestures::activate(box);
            desktop::gestures::press(box, key);
        });
        EXPECT_EQ(desktop::ask(u"Are you SURE ?"_s, Icon::Critical, {}, preset), yes) << key;
    }
    for (const auto& [key, typed] : {std::pair(Qt::Key_Return, u"abc"_s), std::pair(Qt::Key_Escape, QString())}) {
        whenShown<QInputDialog>([&](QInputDialog& box) {
            desktop::gestures::activate(box);
            desktop::gestures::type(box, u"abc"_s);
            desktop::gestures::press(box, key);
        });
        EXPECT_EQ(desktop::inputBox(u"Filter?"_s, {}), typed);
    }
}

TEST_F(Person, SeesHowFarAWorkIsOnceItTakesHalfASecond)
{
    const auto valueShown = [](const QProgressBar* bar) { return bar && bar->isVisible() ? bar->value() : -1; };
    const auto ownBar = []() -> const QProgressBar* {
        for (const QWidget* window : QApplication::topLevelWidgets())
            if (window->windowTitle() == u"KEST Messages"_s)
                return window->findChild<QProgressBar*>();
        return nullptr;
    };
    desktop::Form window(u"frmSample"_s, u"Sample"_s);
    QProgressBar bar(&window);
    bar.hide();
    for (const bool hasBar : {false, true}) {
        window.setVisible(hasBar);
        {
            desktop::Progress progress(u"KEST Messages"_s, u"Reading"_s, &bar);
            progress.step(1, 10);
            EXPECT_EQ(valueShown(ownBar()) + valueShown(&bar), -2);
            QThread::msleep(501);
            progress.step(5, 10);
            EXPECT_EQ(valueShown(ownBar()), hasBar ? -1 : 50);
            EXPECT_EQ(valueShown(&bar), hasBar ? 50 : -1);
            ASSERT_TRUE(QGuiApplication::overrideCursor());
            whenShown<QMessageBox>([](QMessageBox& box) {
                EXPECT_EQ(QGuiApplication::overrideCursor()->shape(), Qt::ArrowCursor);
                box.close();
            });
            desktop::msgBox(u"Message x.xml unreadable"_s);
            EXPECT_EQ(QGuiApplication::overrideCursor()->shape(), Qt::WaitCursor);
        }
        EXPECT_EQ(valueShown(ownBar()) + valueShown(&bar), -2);
        EXPECT_FALSE(QGuiApplication::overrideCursor());
    }
}

TEST_F(Person, FindsEveryWindowAsItWasLeft)
{
    for (const bool again : {false, true}) {
        desktop::Form window(u"frmMessageList"_s, u"KEST Messages"_s);
        window.resize(400, 300);
        whenShown<desktop::Form>([again](desktop::Form& shown) {
            const QRect screen = shown.screen()->availableGeometry();
            EXPECT_LE((shown.frameGeometry().center() - screen.center()).manhattanLength(), 4);
            EXPECT_EQ(shown.width(), again ? 500 : 400);
            EXPECT_EQ(shown.height(), again ? screen.height() : 300) << "never larger than the screen";
            shown.resize(500, 5000);
            shown.move(0, 0);
            shown.close();
        });
        desktop::showModal(window);
    }
}

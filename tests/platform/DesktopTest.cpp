// The seam of boxes, input boxes and programs; the guard of window events; what is remembered of a window.
#include "platform/RuntimeError.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/Gestures.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Prompt.h"
#include "platform/files/files.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QFile>
#include <QHeaderView>
#include <QInputDialog>
#include <QJsonDocument>
#include <QMessageBox>
#include <QProgressBar>
#include <QPushButton>
#include <QScreen>
#include <QThread>
#include <QTimer>
#include <QTreeWidget>

namespace kest {

using namespace Qt::StringLiterals;
using desktop::Answer;
using desktop::Icon;
using test::ScriptedDesktop;
using test::TestProfile;

TEST(Seam, TheScriptAnswersByTheFirstEntryThatFitsAndElseByTheDefault)
{
    ScriptedDesktop desk(R"({
        "boxes": [ {"text": "SURE", "answer": "yes"}, {"text": "SURE ?", "answer": "no"} ],
        "inputs": [ {"text": "filter", "answer": "abc"} ] })");

    EXPECT_TRUE(desktop::ask(u"Are you SURE ?"_s, Icon::Critical, {}, Answer::No));
    EXPECT_TRUE(desktop::ask(u"Are you SURE ?"_s, Icon::Critical, {}, Answer::No)) << "entries are not used up";
    EXPECT_FALSE(desktop::ask(u"Overwrite?"_s, Icon::Exclamation, u"Login"_s, Answer::No));
    EXPECT_TRUE(desktop::ask(u"Go on?"_s));
    desktop::msgBox(u"Message Loaded"_s);
    EXPECT_EQ(desktop::inputBox(u"Enter a filter"_s, u"List"_s), u"abc"_s);
    EXPECT_EQ(desktop::inputBox(u"Enter a name"_s, {}), QString());

    EXPECT_EQ(desk.boxes(), (QStringList{u"critical||Are you SURE ?|yes"_s, u"critical||Are you SURE ?|yes"_s,
                                         u"exclamation|Login|Overwrite?|no"_s, u"question||Go on?|yes"_s,
                                         u"none||Message Loaded|ok"_s}));
    EXPECT_EQ(
        QJsonDocument(desk.record().boxes[2].toObject()).toJson(QJsonDocument::Compact),
        R"({"answer":"no","buttons":"yesno","default":"no","icon":"exclamation","text":"Overwrite?","title":"Login"})");
    EXPECT_EQ(QJsonDocument(desk.record().inputs[0].toObject()).toJson(QJsonDocument::Compact),
              R"({"answer":"abc","prompt":"Enter a filter","title":"List"})");
}

TEST(Seam, AnAnswerThatTheBoxDoesNotOfferEndsTheRun)
{
    ScriptedDesktop desk(R"({"boxes": [ {"text": "Loaded", "answer": "yes"}, {"text": "SURE", "answer": "ok"} ]})");
    EXPECT_THROW(desktop::msgBox(u"Message Loaded"_s), desktop::NeedsAnswer);
    EXPECT_THROW(desktop::ask(u"SURE ?"_s), desktop::NeedsAnswer);
}

TEST(Seam, AProgramIsStartedUnderItsHostName)
{
    TestProfile profile;
    ScriptedDesktop desk;
    const QString trace = profile.root() + u"/started"_s;
    QFile program(profile.driveC() + u"/KESTWeb.exe"_s);
    ASSERT_TRUE(program.open(QIODevice::WriteOnly));
    const QByteArray name = '\'' + trace.toUtf8() + '\'';
    program.write("#!/bin/sh\nprintf %s \"$KEST2_PROFILE\" > " + name + ".new && mv " + name + ".new " + name + '\n');
    program.close();

    EXPECT_THROW(desktop::startProgram(u"c:\\KESTWeb.exe"_s), RuntimeError) << "not marked as a program";
    program.setPermissions(program.permissions() | QFile::ExeOwner);
    desktop::startProgram(u"C:\\kestweb.EXE"_s);
    for (int waited = 0; !files::exists(trace) && waited < 5000; waited += 10)
        QThread::msleep(10);
    EXPECT_EQ(files::read(trace), profile.root()) << "it works on the profile of who started it";
    EXPECT_THROW(desktop::startProgram(u"c:\\missing.exe"_s), RuntimeError);
}

namespace {

/// Waits for a window of this kind to come up and acts on it.
template <class Window, class Act>
void whenShown(const Act& act)
{
    auto* timer = new QTimer(qApp);
    QObject::connect(timer, &QTimer::timeout, timer, [timer, act] {
        if (auto* window = qobject_cast<Window*>(QApplication::activeModalWidget())) {
            timer->deleteLater();
            timer->stop();
            act(*window);
        }
    });
    timer->start(1);
}

struct Person : testing::Test {
    Person() { desktop::usePerson(); }
    ~Person() override
    {
        desktop::useScript(nullptr);
        desktop::setFailureReporter({});
    }
    TestProfile profile;
};

}  // namespace

TEST_F(Person, SeesABoxAsItWasMeant)
{
    for (const QString& title : {QString(), u"Login"_s}) {
        whenShown<QMessageBox>([&](QMessageBox& box) {
            EXPECT_EQ(box.text(), u"<b>not bold</b>"_s);
            EXPECT_EQ(box.textFormat(), Qt::PlainText);
            EXPECT_EQ(box.icon(), QMessageBox::Critical);
            EXPECT_EQ(box.windowTitle(), title.isEmpty() ? u"KEST"_s : title);
            box.close();
        });
        desktop::msgBox(u"<b>not bold</b>"_s, Icon::Critical, title);
    }
}

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

TEST_F(Person, KeepsTheWindowAfterAFailureThatNobodyTrapped)
{
    QStringList reported;
    desktop::setFailureReporter([&](const RuntimeError& error, const QString& source) {
        reported.append(source + u": "_s + error.description());
    });
    desktop::Form window(u"frmSample"_s, u"Sample"_s);
    QPushButton button(&window);
    desktop::onEvent(&button, &QPushButton::clicked, &window, u"frmSample.cmdOK_Click"_s,
                     [] { throw RuntimeError(NoCurrentRow, u"no row"_s); });
    whenShown<desktop::Form>([&](desktop::Form& shown) {
        button.click();
        EXPECT_TRUE(shown.isVisible());
        shown.close();
    });
    desktop::showModal(window);
    EXPECT_EQ(reported, QStringList{u"frmSample.cmdOK_Click: no row"_s});
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

TEST_F(Person, FindsEveryWindowAsItWasLeftAndInTheMiddle)
{
    const auto makeWindow = [] {
        auto window = std::make_unique<desktop::Form>(u"frmMessageList"_s, u"KEST Messages"_s);
        auto* list = new QTreeWidget(window.get());
        list->setObjectName(u"ListView1"_s);
        list->setHeaderLabels({u"Filename"_s, u"Type"_s, u"Rego"_s});
        list->setSortingEnabled(true);
        list->header()->resizeSection(0, 100);
        window->resize(400, 300);
        return window;
    };
    const auto show = [](desktop::Form& window, const std::function<void(QHeaderView&)>& act) {
        whenShown<desktop::Form>([&act](desktop::Form& shown) {
            const QPoint off = shown.frameGeometry().center() - shown.screen()->availableGeometry().center();
            EXPECT_LE(off.manhattanLength(), 4);
            act(*shown.findChild<QTreeWidget*>()->header());
            shown.close();
        });
        desktop::showModal(window);
    };

    const auto left = makeWindow();
    show(*left, [&](QHeaderView& header) {
        left->resize(500, 5000);
        left->move(0, 0);
        header.resizeSection(0, 222);
        header.setSortIndicator(1, Qt::DescendingOrder);
    });

    const auto found = makeWindow();
    show(*found, [&](QHeaderView& header) {
        EXPECT_EQ(found->width(), 500);
        EXPECT_EQ(found->height(), found->screen()->availableSize().height()) << "never larger than the screen";
        EXPECT_EQ(header.sectionSize(0), 222);
        EXPECT_EQ(header.sectionSize(1), header.defaultSectionSize());
        EXPECT_EQ(header.sortIndicatorSection(), 1);
        EXPECT_EQ(header.sortIndicatorOrder(), Qt::DescendingOrder);
    });
}

}  // namespace kest

// The seam of boxes, input boxes and programs; the guard of window events; what is remembered of a window.
#include "platform/RuntimeError.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/Prompt.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QFile>
#include <QLineEdit>
#include <QMessageBox>
#include <QPushButton>
#include <QTimer>
#include <QTreeWidget>

namespace kest {

using namespace Qt::StringLiterals;
using desktop::Answer;
using desktop::Icon;
using test::ScriptedDesktop;
using test::TestProfile;

TEST(Seam, AsksForAPersonWhereNobodyAnswers)
{
    EXPECT_THROW(desktop::msgBox(u"Hello"_s), desktop::NeedsAnswer);
    EXPECT_THROW(desktop::ask(u"Sure?"_s), desktop::NeedsAnswer);
    EXPECT_THROW(desktop::inputBox(u"Which?"_s, {}), desktop::NeedsAnswer);
}

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
    EXPECT_EQ(desk.record().boxes[2].toObject(), (QJsonObject{{u"icon"_s, u"exclamation"_s},
                                                              {u"title"_s, u"Login"_s},
                                                              {u"text"_s, u"Overwrite?"_s},
                                                              {u"buttons"_s, u"yesno"_s},
                                                              {u"default"_s, u"no"_s},
                                                              {u"answer"_s, u"no"_s}}));
    EXPECT_EQ(desk.record().inputs[0].toObject(),
              (QJsonObject{{u"title"_s, u"List"_s}, {u"prompt"_s, u"Enter a filter"_s}, {u"answer"_s, u"abc"_s}}));
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
    program.write("#!/bin/sh\ntouch '" + trace.toUtf8() + "'\n");
    program.close();

    EXPECT_THROW(desktop::startProgram(u"c:\\KESTWeb.exe"_s), RuntimeError) << "not marked as a program";
    program.setPermissions(program.permissions() | QFile::ExeOwner);
    desktop::startProgram(u"C:\\kestweb.EXE"_s);
    for (int waited = 0; !QFile::exists(trace) && waited < 5000; waited += 10)
        QThread::msleep(10);
    EXPECT_TRUE(QFile::exists(trace));
    EXPECT_THROW(desktop::startProgram(u"c:\\missing.exe"_s), RuntimeError);
}

}  // namespace kest

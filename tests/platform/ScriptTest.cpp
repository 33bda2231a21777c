// A script's steps work a window as a person does, and a step that a person could not take ends the run.
#include "platform/RuntimeError.h"
#include "platform/desktop/Form.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QCheckBox>
#include <QCloseEvent>
#include <QComboBox>
#include <QIntValidator>
#include <QJsonDocument>
#include <QLabel>
#include <QLineEdit>
#include <QListWidget>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QShortcut>
#include <QSpinBox>
#include <QTabBar>
#include <QTimer>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace kest {

using namespace Qt::StringLiterals;
using desktop::NeedsAnswer;
using desktop::onEvent;
using test::ScriptedDesktop;
using test::TestProfile;

namespace {

/// One control of each kind, each of whose events is noted.
class SampleWindow : public desktop::Form {
public:
    SampleWindow() : Form(u"frmSample"_s, u"Sample"_s)
    {
        layout = new QVBoxLayout(this);
        for (int option = 0; option < 2; ++option) {
            auto* button = add(new QRadioButton(u"&Folder %1"_s.arg(option)), u"Option1(%1)"_s.arg(option));
            onEvent(button, &QRadioButton::clicked, this, u"click"_s, [=, this] { note(u"option %1"_s.arg(option)); });
        }
        auto* check = add(new QCheckBox(u"Read && Only"_s), u"chkReadOnly"_s);
        onEvent(check, &QCheckBox::toggled, this, u"click"_s, [this](bool on) { note(on ? u"on"_s : u"off"_s); });

        auto* line = add(new QLineEdit(u"old"_s), u"txtLine"_s);
        onEvent(line, &QLineEdit::textEdited, this, u"change"_s, [this](const QString& text) { note(u'~' + text); });
        onEvent(line, &QLineEdit::returnPressed, this, u"enter"_s, [this] { note(u"enter"_s); });
        auto* digits = add(new QLineEdit, u"txtDigits"_s);
        digits->setValidator(new QIntValidator(digits));
        add(new QPlainTextEdit(u"old"_s), u"txtRemarks"_s);
        add(new QSpinBox, u"spnCount"_s)->setRange(0, 99);
        auto* combo = add(new QComboBox, u"cmbGear"_s);
        combo->addItems({u"Automatic"_s, u"Manual"_s, u"Other"_s});

        auto* list = add(new QTreeWidget, u"ListView1"_s);
        list->setHeaderLabels({u"Filename"_s, u"Type"_s});
        for (const QString& name : {u"a.xml"_s, u"b.xml"_s, u"c.xml"_s})
            list->addTopLevelItem(new QTreeWidgetItem({name, u"Type of "_s + name}));
        onEvent(list, &QTreeWidget::itemClicked, this, u"item"_s,
                [this](const QTreeWidgetItem* item, int) { note(item->text(0)); });
        onEvent(list, &QTreeWidget::itemDoubleClicked, this, u"item"_s,
                [this](const QTreeWidgetItem* item, int) { note(u"twice "_s + item->text(0)); });
        auto* names = add(new QListWidget, u"lvColour"_s);
        for (int row = 0; row < 50; ++row)
            names->addItem(u"Colour %1"_s.arg(row));

        auto* tabs = add(new QTabBar, u"TabStrip1"_s);
        for (const QString& sub : {u"0"_s, u"1"_s})
            tabs->setTabData(tabs->addTab(u"Add.-"_s + sub), u'S' + sub);
        onEvent(tabs, &QTabBar::currentChanged, this, u"tab"_s, [this](int tab) { note(u"tab %1"_s.arg(tab)); });

        auto* ok = add(new QPushButton(u"&OK"_s), u"cmdOK"_s);
        onEvent(ok, &QPushButton::clicked, this, u"click"_s, [this] {
            note(u"ok"_s);
            whenOk();
        });
        add(new QPushButton(u"Off"_s), u"cmdOff"_s)->setEnabled(false);
        add(new QPushButton(u"Gone"_s), u"cmdGone"_s)->hide();
        onEvent(add(desktop::exitButton(this, {}), u"cmdExit"_s), &QPushButton::clicked, this, u"exit"_s,
                [this] { close(); });
        find = new QShortcut(QKeySequence(u"Ctrl+F"_s), this);
        onEvent(find, &QShortcut::activated, this, u"find"_s, [this] { note(u"find"_s); });
    }

    QStringList notes;
    std::function<void()> whenOk = [] {};
    bool mayClose = true;

protected:
    void closeEvent(QCloseEvent* event) override
    {
        note(u"close box"_s);
        mayClose ? desktop::Form::closeEvent(event) : event->ignore();
    }

private:
    template <class Control>
    Control* add(Control* control, const QString& name)
    {
        control->setObjectName(name);
        layout->addWidget(control);
        return control;
    }
    void note(const QString& what) { notes.append(what); }

    QVBoxLayout* layout;
    QShortcut* find;
};

struct Steps : testing::Test {
    TestProfile profile;
    SampleWindow window;

    /// Shows the window with these steps and reads all controls behind them.
    QJsonObject run(const QString& steps)
    {
        const QString visit = steps + (steps.isEmpty() ? u""_s : u","_s) + u"{\"read\": true}"_s;
        const ScriptedDesktop desk(uR"j({"windows": {"frmSample": [ [ %1 ] ]}})j"_s.arg(visit).toUtf8());
        desktop::showModal(window);
        return desk.record().reads.last()[u"values"_s].toObject();
    }
    /// The reason why the steps could not be taken.
    QString refusal(const QString& steps)
    {
        try {
            run(steps);
        } catch (const NeedsAnswer& needed) {
            EXPECT_FALSE(window.isVisible());
            return needed.reason();
        }
        return {};
    }
};

}  // namespace

TEST_F(Steps, ReachTheControlsAsAPersonWould)
{
    const std::pair<QString, QStringList> cases[] = {
        {uR"j({"click": "Option1(1)"})j"_s, {u"option 1"_s}},
        {uR"j({"click": "chkReadOnly"}, {"click": "chkReadOnly"})j"_s, {u"on"_s, u"off"_s}},
        {uR"j({"set": "txtLine", "text": "aB"})j"_s, {u"~"_s, u"~a"_s, u"~aB"_s}},
        {uR"j({"key": "txtLine", "keys": ["End", "Backspace", "Shift+X", "Return"]})j"_s,
         {u"~ol"_s, u"~olX"_s, u"enter"_s}},
        {uR"j({"key": "frmSample", "keys": "Ctrl+F"})j"_s, {u"find"_s}},
        {uR"j({"key": "chkReadOnly", "keys": ["Space", "Tab", "Q"]})j"_s, {u"on"_s, u"~q"_s}},
        {uR"j({"select": "ListView1", "item": "b.xml"})j"_s, {u"b.xml"_s}},
        {uR"j({"select": "ListView1", "item": 2}, {"doubleClick": "ListView1"})j"_s,
         {u"c.xml"_s, u"c.xml"_s, u"twice c.xml"_s}},
        {uR"j({"select": "ListView1", "item": 0}, {"select": "ListView1", "item": 0})j"_s, {u"a.xml"_s, u"a.xml"_s}},
        {uR"j({"tab": "TabStrip1", "key": "S1"}, {"tab": "TabStrip1", "key": "Add.-0"})j"_s, {u"tab 1"_s, u"tab 0"_s}}};
    for (const auto& [steps, notes] : cases) {
        SCOPED_TRACE(steps.toStdString());
        SampleWindow fresh;
        const ScriptedDesktop desk(uR"j({"windows": {"frmSample": [ [ %1 ] ]}})j"_s.arg(steps).toUtf8());
        desktop::showModal(fresh);
        EXPECT_EQ(fresh.notes, notes + QStringList{u"close box"_s});
    }
}

TEST_F(Steps, TypeIntoEveryKindOfField)
{
    const QJsonObject seen =
        run(uR"j({"set": "txtDigits", "text": "1x2"}, {"set": "spnCount", "text": "42"},
        {"set": "txtRemarks", "text": "first\r\nsecond (x)"}, {"set": "cmbGear", "text": "Manual"},
        {"select": "lvColour", "item": "Colour 40"}, {"set": "txtLine", "text": ""})j"_s);
    QStringList texts;
    for (const QString& control : {u"txtDigits"_s, u"spnCount"_s, u"txtRemarks"_s, u"cmbGear"_s, u"txtLine"_s})
        texts << seen[control][u"text"_s].toString();
    EXPECT_EQ(texts.join(u'|'), u"12|42|first\nsecond (x)|Manual|"_s);
    EXPECT_EQ(window.findChild<QListWidget*>()->currentItem()->text(), u"Colour 40"_s);
}

TEST_F(Steps, ReadWhatTheControlsHave)
{
    const QJsonObject seen = run(uR"j({"click": "Option1(0)"})j"_s);
    const std::pair<QString, QByteArray> readings[] = {
        {u"Option1(0)"_s, R"j({"checked":true,"enabled":true,"text":"Folder 0","visible":true})j"},
        {u"chkReadOnly"_s, R"j({"checked":false,"enabled":true,"text":"Read & Only","visible":true})j"},
        {u"cmdOff"_s, R"j({"enabled":false,"text":"Off","visible":true})j"},
        {u"cmdGone"_s, R"j({"enabled":true,"text":"Gone","visible":false})j"},
        {u"txtLine"_s, R"j({"enabled":true,"text":"old","visible":true})j"},
        {u"TabStrip1"_s,
         R"j({"enabled":true,"rows":[["Add.-0","S0"],["Add.-1","S1"]],"text":"Add.-0","visible":true})j"},
        {u"ListView1"_s, R"j({"enabled":true,"rows":[["a.xml","Type of a.xml"],["b.xml","Type of b.xml"],)j"
                         R"j(["c.xml","Type of c.xml"]],"visible":true})j"}};
    for (const auto& [control, reading] : readings)
        EXPECT_EQ(QJsonDocument(seen[control].toObject()).toJson(QJsonDocument::Compact), reading);

    const ScriptedDesktop desk(R"j({"windows": {"frmSample": [ [ {"read": "frmSample"}, {"read": ["txtLine"]} ] ]}})j");
    desktop::showModal(window);
    EXPECT_EQ(desk.read(u"frmSample"_s).toString(), u"Sample"_s);
    EXPECT_EQ(desk.record().reads[1].toObject().keys(), (QStringList{u"values"_s, u"window"_s}));
    EXPECT_EQ(desk.record().reads[1][u"values"_s].toObject().keys(), QStringList{u"txtLine"_s});
}

TEST_F(Steps, ResizeWaitAndPhotograph)
{
    bool ticked = false;
    QTimer::singleShot(60, &window, [&] { ticked = true; });
    const QString file = profile.root() + u"/shot.png"_s;
    run(uR"j({"resize": [9000, 10500]}, {"wait": 100}, {"shot": "%1"})j"_s.arg(file));
    EXPECT_EQ(desktop::pixels(9000, 10500).width(), window.width());
    EXPECT_EQ(QImage(file).width(), window.width());
    EXPECT_TRUE(ticked);
}

TEST_F(Steps, ThatAPersonCouldNotTakeEndTheRunAndSayWhich)
{
    QLabel cover(u"cover"_s, &window);
    cover.setObjectName(u"lblCover"_s);
    cover.setGeometry(0, 0, 4000, 40);
    const std::pair<QString, QString> cases[] = {{uR"j({"click": "cmdOff"})j"_s, u"disabled"_s},
                                                 {uR"j({"click": "cmdGone"})j"_s, u"hidden"_s},
                                                 {uR"j({"click": "cmdMissing"})j"_s, u"no such control"_s},
                                                 {uR"j({"click": "Option1(0)"})j"_s, u"covered by lblCover"_s},
                                                 {uR"j({"set": "cmbGear", "text": "Reverse"})j"_s, u"no such row"_s},
                                                 {uR"j({"select": "ListView1", "item": "z.xml"})j"_s, u"no such row"_s},
                                                 {uR"j({"doubleClick": "ListView1"})j"_s, u"no row is chosen"_s},
                                                 {uR"j({"tab": "TabStrip1", "key": "S7"})j"_s, u"no such tab"_s},
                                                 {uR"j({"read": ["cmdMissing"]})j"_s, u"cmdMissing"_s},
                                                 {uR"j({"shot": "/no/such/folder/x.png"})j"_s, u"can't be written"_s}};
    for (const auto& [step, why] : cases) {
        const QString reason = refusal(u"{\"wait\": 0}, "_s + step);
        EXPECT_TRUE(reason.contains(why) && reason.startsWith(u"frmSample, step 2 "_s)) << reason.toStdString();
        const QString control = QJsonDocument::fromJson(step.toUtf8()).object().begin()->toString();
        EXPECT_TRUE(reason.contains(control)) << reason.toStdString();
    }
    EXPECT_TRUE(refusal(uR"j({"click": "cmdExit"}, {"click": "cmdOK"})j"_s).contains(u"hidden"_s));

    window.mayClose = false;
    EXPECT_TRUE(refusal({}).contains(u"refused to close"_s));
}

TEST_F(Steps, OfEachShowingAreAVisitOfTheirOwnAndTheLastServesAllFurtherOnes)
{
    const ScriptedDesktop desk(
        R"j({"windows": {"frmSample": [ [ {"click": "chkReadOnly"} ], [ {"click": "cmdOK"} ] ]}})j");
    for (int showing = 0; showing < 3; ++showing)
        desktop::showModal(window);
    EXPECT_EQ(window.notes.join(u' '), u"on close box ok close box ok close box"_s);
}

TEST_F(Steps, OfAnInnerWindowThatFailEndTheOuterRunToo)
{
    SampleWindow inner;
    inner.setObjectName(u"frmInner"_s);
    bool wentOn = false;
    window.whenOk = [&] {
        attempt([&] { desktop::showModal(inner); });
        wentOn = true;
    };
    const ScriptedDesktop desk(R"j({"windows": {
        "frmSample": [ [ {"click": "cmdOK"}, {"click": "Option1(1)"} ] ],
        "frmInner":  [ [ {"click": "cmdOff"} ] ]}})j");
    try {
        desktop::showModal(window);
        FAIL() << "the run went on";
    } catch (const NeedsAnswer& needed) {
        EXPECT_TRUE(needed.reason().startsWith(u"frmInner, step 1 "_s)) << needed.what();
    }
    EXPECT_FALSE(wentOn) << "errors are passed over, but not this";
    EXPECT_FALSE(window.isVisible() || inner.isVisible());
    EXPECT_EQ(window.notes, QStringList{u"ok"_s});
}

TEST(ScriptForm, IsCheckedBeforeAnythingRuns)
{
    const std::pair<const char*, QString> wrong[] = {
        {R"j({"window": {}})j", u"window"_s},
        {R"j({"boxes": {"text": "a", "answer": "yes"}})j", u"boxes"_s},
        {R"j({"boxes": [{"text": "a", "answer": "maybe"}]})j", u"maybe"_s},
        {R"j({"inputs": [{"text": "a", "answer": 1}]})j", u"inputs"_s},
        {R"j({"windows": {"frmA": [{"click": "x"}]}})j", u"frmA"_s},
        {R"j({"windows": {"frmA": [[], [{"clik": "x"}]]}})j", u"frmA, visit 2, step 1"_s},
        {R"j({"windows": {"frmA": [[{"click": "a", "text": "b"}]]}})j", u"text"_s},
        {R"j({"windows": {"frmA": [[{"key": "a", "keys": "Retrun"}]]}})j", u"Retrun"_s},
        {R"j({"windows": {"frmA": [[{"select": "a", "item": -1}]]}})j", u"item"_s},
        {R"j({"windows": {"frmA": [[{"wait": "long"}]]}})j", u"wait"_s},
        {R"j({"windows": {"frmA": [[{"read": 5}]]}})j", u"read"_s}};
    for (const auto& [script, named] : wrong) {
        try {
            desktop::Script{QJsonDocument::fromJson(script).object()};
            ADD_FAILURE() << script;
        } catch (const RuntimeError& error) {
            EXPECT_TRUE(error.description().contains(named)) << error.what();
        }
    }
}

}  // namespace kest

// Tests that the steps of a script act like a person, and that a step that a person could not do ends the run.
#include "platform/desktop/Form.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"

using desktop::NeedsAnswer;

/// A window with a control of each kind. It records all their events.
struct SampleWindow : desktop::Form {
    SampleWindow() : Form(u"frmSample"_s, u"Sample"_s)
    {
        setLayout(new QVBoxLayout);
        const auto noted = [this](const QString& text) { return [this, text] { notes.append(text); }; };
        add("cmdUnder", new QPushButton)->setFixedHeight(40);
        auto* cover = new QLabel(this);
        cover->setObjectName(u"lblCover"_s);
        cover->setGeometry(0, 0, 4000, 40);
        connect(add("Option1(0)", new QRadioButton(u"&Folder"_s)), &QRadioButton::clicked, noted(u"option 0"_s));
        connect(add("Option1(1)", new QRadioButton), &QRadioButton::clicked, noted(u"option 1"_s));
        connect(add("chkReadOnly", new QCheckBox(u"Read && Only"_s)), &QCheckBox::toggled,
                [this](bool on) { notes.append(on ? u"on"_s : u"off"_s); });

        auto* line = add("txtLine", new QLineEdit(u"old"_s));
        connect(line, &QLineEdit::textEdited, [this](const QString& text) { notes.append(u'~' + text); });
        connect(line, &QLineEdit::returnPressed, noted(u"enter"_s));
        add("txtDigits", new QLineEdit)->setValidator(new QIntValidator(this));
        add("txtRemarks", new QPlainTextEdit(u"old"_s));
        add("spnCount", new QSpinBox);
        add("cmbGear", new QComboBox)->addItems({u"Automatic"_s, u"Manual"_s});

        auto* list = add("ListView1", new QTreeWidget);
        list->setColumnCount(2);
        for (const QString& name : {u"a.xml"_s, u"b.xml"_s, u"c.xml"_s})
            list->addTopLevelItem(new QTreeWidgetItem({name, u"Type of "_s + name}));
        connect(list, &QTreeWidget::itemClicked, [this](auto* item) { notes.append(item->text(0)); });
        connect(list, &QTreeWidget::itemDoubleClicked,
                [this](auto* item) { notes.append(u"twice "_s + item->text(0)); });
        auto* tabs = add("TabStrip1", new QTabBar);
        for (const QString& sub : {u"0"_s, u"1"_s})
            tabs->setTabData(tabs->addTab(u"Add.-"_s + sub), u'S' + sub);
        connect(tabs, &QTabBar::currentChanged, [this](int tab) { notes.append(u"tab %1"_s.arg(tab)); });

        desktop::onEvent(add("cmdOK", new QPushButton), &QPushButton::clicked, this, u"click"_s, [this] { whenOk(); });
        add("cmdOff", new QPushButton(u"Off"_s))->setEnabled(false);
        add("cmdGone", new QPushButton(u"Gone"_s))->hide();
        connect(add("cmdExit", new QPushButton), &QPushButton::clicked, this, &QDialog::close);
        connect(new QShortcut(QKeySequence(u"Ctrl+F"_s), this), &QShortcut::activated, noted(u"find"_s));
    }

    QStringList notes;
    std::function<void()> whenOk = [this] { notes.append(u"ok"_s); };

protected:
    /// The window stays open while Option1(0) is selected.
    void closeEvent(QCloseEvent* event) override
    {
        findChild<QRadioButton*>()->isChecked() ? event->ignore() : Form::closeEvent(event);
    }

private:
    template <class Control>
    Control* add(const char* name, Control* control)
    {
        control->setObjectName(QLatin1StringView(name));
        layout()->addWidget(control);
        return control;
    }
};

struct Steps : testing::Test {
    test::TestProfile profile;
    std::optional<SampleWindow> window;
    std::optional<ScriptedDesktop> desk;

    /// Shows the window and does these steps. Returns the recorded events, or why a step could not be done.
    QString run(const QString& steps)
    {
        window.emplace();
        desk.emplace(uR"j({"windows": {"frmSample": [ [ %1 ] ]}})j"_s.arg(steps).toUtf8());
        try {
            desktop::showModal(*window);
            return window->notes.join(u", "_s);
        } catch (const NeedsAnswer& needed) {
            EXPECT_FALSE(window->isVisible());
            return needed.reason();
        }
    }
};

TEST_F(Steps, AreThoseOfAPerson)
{
    for (const QStringList& row : test::rowsIn("script-steps.txt"))
        EXPECT_EQ(run(row[0]), row[1]) << row[0];
}

TEST_F(Steps, ReadWhatTheyTyped)
{
    run(uR"j({"click": "chkReadOnly"}, {"set": "txtDigits", "text": "1x2"}, {"set": "spnCount", "text": "42"},
        {"set": "txtRemarks", "text": "first\r\nsecond (x)"}, {"set": "cmbGear", "text": "Manual"},
        {"set": "txtLine", "text": ""}, {"read": true}, {"read": ["frmSample", "txtLine"]})j"_s);
    const QJsonArray reads = desk->record().reads;
    ASSERT_EQ(reads.size(), 2);
    for (const QStringList& row : test::rowsIn("script-readings.txt"))
        EXPECT_EQ(reads[0][u"values"_s][row[0]], QJsonDocument::fromJson(row[1].toUtf8()).object()) << row[0];
    EXPECT_EQ(reads[1][u"values"_s].toObject().keys(), (QStringList{u"frmSample"_s, u"txtLine"_s}));
    EXPECT_EQ(desk->read(u"frmSample"_s).toString(), u"Sample"_s);
}

TEST_F(Steps, PhotographAResizedWindow)
{
    const QString file = profile.root() + u"/shot.png"_s;
    const QDeadlineTimer wait(100);
    run(uR"j({"resize": [9000, 10500]}, {"wait": 100}, {"shot": "%1"})j"_s.arg(file));
    EXPECT_TRUE(wait.hasExpired());
    EXPECT_EQ(window->width(), desktop::pixels(9000));
    EXPECT_EQ(QImage(file).size(), window->size());
}

TEST_F(Steps, OfEachShowingAreAVisitOfTheirOwn)
{
    SampleWindow sample;
    const ScriptedDesktop visits(
        R"j({"windows": {"frmSample": [ [ {"click": "chkReadOnly"} ], [ {"click": "cmdOK"} ] ]}})j");
    for (int showing = 0; showing < 3; ++showing)
        desktop::showModal(sample);
    EXPECT_EQ(sample.notes.join(u' '), u"on ok ok"_s);
}

TEST_F(Steps, OfAnInnerWindowThatFailEndTheOuterRunToo)
{
    SampleWindow outer;
    desktop::Form inner(u"frmInner"_s, {});
    outer.whenOk = [&] {
        attempt([&] { desktop::showModal(inner); });
        ADD_FAILURE() << "errors are passed over, but not this";
    };
    const ScriptedDesktop visits(R"j({"windows": {"frmSample": [ [ {"click": "cmdOK"}, {"click": "Option1(1)"} ] ],
                                                  "frmInner": [ [ {"click": "cmdMissing"} ] ]}})j");
    EXPECT_THROW(desktop::showModal(outer), NeedsAnswer);
    EXPECT_FALSE(outer.isVisible() || inner.isVisible());
    EXPECT_EQ(outer.notes, QStringList());
}

TEST(ScriptForm, IsCheckedBeforeAnythingRuns)
{
    for (const QStringList& row : test::rowsIn("script-form.txt")) {
        const auto read = [&] { desktop::Script{QJsonDocument::fromJson(row[0].toUtf8()).object()}; };
        EXPECT_TRUE(!row[1].isEmpty() && failure(read).description().contains(row[1])) << row[0];
    }
}

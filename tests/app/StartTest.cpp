// Tests the start from the menu on a computer without a profile.
#include "app/CommandLine.h"
#include "app/Commands.h"
#include "app/ProfileWindow.h"
#include "base/ModRegistry.h"
#include "base/modDBAccess.h"
#include "platform/Waiting.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"

struct Start : ::testing::Test {
    Start() { profile::setRoot(place); }
    ~Start() override
    {
        desktop::useScript(nullptr);
        setWait({});
        setWorkStep({});
        profile::setRoot({});
    }

    /// Starts the command as the menu does. Operates the windows that a person would see, or closes them.
    int open(const Hands::Work& inTheQuestion)
    {
        names.clear();
        QPointer<QDialog> last;
        QTimer look;
        QObject::connect(&look, &QTimer::timeout, &look, [&] {
            auto* window = qobject_cast<QDialog*>(QApplication::activeModalWidget());
            if (!window || window == last)
                return;
            last = window;
            names << window->objectName();
            if (window->objectName() == u"frmProfile"_s)
                inTheQuestion(*window);
            window->close();
        });
        look.start(5);
        return app::run(app::parsed({u"open"_s}));
    }

    QTemporaryDir folder{memoryFolder(u"start"_s)};
    QString place = folder.path() + u"/data/kest2"_s;
    QStringList names;
};

/// Types a folder and clicks "Create".
static Hands::Work create(const QString& path)
{
    return [path](QDialog& window) {
        control<QLineEdit>(window, "txtFolder").setText(path);
        control<QLineEdit>(window, "txtName").setText(u" Café Repairs"_s);
        control<QPushButton>(window, "cmdOK").click();
    };
}

TEST_F(Start, OpensTheShopAtTheChosenPlace)
{
    const QStringList both{u"frmProfile"_s, u"frmKEST"_s};
    const QString other = folder.path() + u"/other shop"_s;
    // a creation that fails, and one that does not
    const std::pair<QString, QString> cases[] = {
        {{}, place}, {{}, other}, {place, place}, {other, place}, {place, other}};
    for (const auto& [failing, chosen] : cases) {
        for (const QString& made : {place, place + u".unfinished"_s, other})
            if (!QFile::remove(made))
                QDir(made).removeRecursively();
        if (failing.isEmpty()) {  // a host has started before
            QDir().mkpath(place);
            driverNumber();
        }
        const auto work = [&](QDialog& window) {
            if (!failing.isEmpty()) {
                qputenv("KEST2_COMPONENT_DIR", "/proc/kest2");  // can't be created
                whenShown<QMessageBox>([](QMessageBox& box) { box.close(); });
                create(failing)(window);
                qunsetenv("KEST2_COMPONENT_DIR");
            }
            create(chosen)(window);
        };
        EXPECT_EQ(open(work), app::Done);
        EXPECT_EQ(names, both);
        EXPECT_TRUE(QFile::exists(chosen + u"/databases/WirSql.db"_s));
        EXPECT_EQ(QFileInfo(place).canonicalFilePath(), chosen);
        EXPECT_EQ(GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"ShopName"_s, {}), u"Café Repairs"_s);
        EXPECT_EQ(open({}), app::Done);
        EXPECT_EQ(names, QStringList(u"frmKEST"_s)) << "the next start finds it";
        EXPECT_EQ(QFile::exists(place + u".unfinished"_s), failing != other && chosen == other);
    }
    EXPECT_TRUE(QFile::remove(place)) << "a link";
    EXPECT_EQ(open(create(other)), app::Done) << "a shop that exists";
    EXPECT_EQ(names, both);
}

TEST_F(Start, CreatesNothingAfterCancelOrInAFolderThatItCannotUse)
{
    const auto cancel = [](QDialog& window) {
        whenShown<QFileDialog>([](QFileDialog& browser) {
            browser.resize(browser.size() + QSize(90, 0));  // nor remembers it
            browser.close();
        });
        control<QPushButton>(window, "cmdBrowse").click();
        control<QPushButton>(window, "cmdCancel").click();
    };
    EXPECT_EQ(open(cancel), app::NoConnection);
    QDir().mkpath(folder.path() + u"/full/of files"_s);
    const ScriptedDesktop desk;
    for (const QString& wrong : {u"shop"_s, folder.path() + u"/full"_s, u"/proc/shop"_s}) {
        const Hands hands({{u"frmProfile"_s, create(wrong)}});
        app::ProfileWindow::ShowForm();
    }
    EXPECT_EQ(desk.boxTexts().size(), 3);
    EXPECT_FALSE(QFileInfo::exists(folder.path() + u"/data"_s));
}

TEST_F(Start, TellsAboutItselfBeforeThereIsAShop)
{
    QString about;
    open([&](QDialog& window) {
        whenShown<QMessageBox>([&](QMessageBox& box) {
            about = box.text();
            box.close();
        });
        desktop::gestures::press(window, Qt::Key_F1);
        create(place)(window);
    });
    for (const QString& part : {u"KEST2 " KEST_VERSION ""_s, place, u"WirSql (embedded)"_s})
        EXPECT_TRUE(about.contains(part)) << about;
    EXPECT_EQ(names.last(), u"frmKEST"_s) << "the question has made nothing";
}

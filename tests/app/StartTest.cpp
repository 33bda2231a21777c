// Tests the start from the menu on a computer without a profile.
#include "app/CommandLine.h"
#include "app/Commands.h"
#include "app/ProfileWindow.h"
#include "platform/Waiting.h"
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
            else
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
        control<QPushButton>(window, "cmdOK").click();
    };
}

TEST_F(Start, AsksWhereTheShopIsToBeAndOpensIt)
{
    const QStringList both{u"frmProfile"_s, u"frmKEST"_s};
    for (const QString& chosen : {place, folder.path() + u"/other shop"_s}) {
        EXPECT_EQ(open(create(chosen)), app::Done);
        EXPECT_EQ(names, both);
        EXPECT_TRUE(QFile::exists(chosen + u"/databases/WirSql.db"_s));
        EXPECT_EQ(QFileInfo(place).canonicalFilePath(), chosen);
        EXPECT_EQ(open({}), app::Done);
        EXPECT_EQ(names, QStringList(u"frmKEST"_s)) << "the next start finds it";
        if (!QFile::remove(place))  // a link
            QDir(place).removeRecursively();
    }
    EXPECT_EQ(open(create(folder.path() + u"/other shop"_s)), app::Done) << "a shop that exists";
    EXPECT_EQ(names, both);
}

TEST_F(Start, CreatesNothingAfterCancelOrInAFolderThatItCannotUse)
{
    const auto cancel = [](QDialog& window) {
        window.resize(window.size() + QSize(90, 0));  // nor remembers it
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

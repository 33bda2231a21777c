// Tests what a person sees and can do while a fill runs, and while a server does not answer.
#include "messagelist/frmMessageList.h"
#include "outbound/QuoteImages.h"
#include "platform/Prompt.h"
#include "platform/Waiting.h"
#include "platform/database/Connection.h"
#include "platform/desktop/Person.h"
#include "platform/desktop/Progress.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"

#include <QSqlDatabase>
#include <QSqlQuery>
#include <QTcpServer>
#include <QTcpSocket>

namespace gestures = desktop::gestures;

struct Waiting : Shop {
    ~Waiting() override
    {
        setWait({});
        setWorkStep({});
    }

    /// Returns the text of the small window that says what is being waited for, or an empty text.
    static QString notice() { return noticeWindow() ? noticeWindow()->findChild<QLabel*>()->text() : QString(); }
    static QWidget* noticeWindow()
    {
        for (QWidget* window : QApplication::topLevelWidgets())
            if (window->isVisible() && !qobject_cast<const QDialog*>(window) && window->findChild<QLabel*>())
                return window;
        return nullptr;
    }
};

TEST_F(Waiting, AFillTakesNoKeyButEscWhichStopsIt)
{
    arrive("0.xml", quoteRequest("QR1").images({"1"}));  // is held back
    for (const char* name : {"a", "b", "c"})
        arrive(std::string(name) + ".xml", cancellation(name));
    const QString stopped = u"0 messages; not all, because Esc has stopped the reading (F5 reads all)"_s;
    QStringList lines;
    const auto work = [&](QDialog& window) {
        auto& read = control<QAbstractButton>(window, "Option1(1)");
        const auto fill = [&](const std::function<void()>& during) {
            QTimer::singleShot(0, &window, during);
            setWorkStep([] {
                QThread::msleep(501);  // from then on it is a long one
                setWorkStep({});
            });
            control<QAbstractButton>(window, "Option1(0)").click();
            gestures::settle();
            lines << control<QLabel>(window, "lblStatus").text();
        };
        fill([&] {
            gestures::press(window, Qt::Key_Delete);
            gestures::press(window, Qt::ALT | Qt::Key_L);
            gestures::click(read, read.rect().center());
        });
        EXPECT_FALSE(read.isChecked());
        fill([&] { gestures::press(window, Qt::Key_Escape); });
        EXPECT_TRUE(window.isVisible()) << "Esc closes it only at rest";
        EXPECT_EQ(control<QToolButton>(window, "cmdHeld").text(), u"1 or more held back (F4)"_s);
        gestures::press(window, Qt::Key_F5);
        lines << control<QLabel>(window, "lblStatus").text();
        gestures::click(read, read.rect().center());
        EXPECT_TRUE(read.isChecked());
    };
    desktop::usePerson();
    const Hands hands({{u"frmMessageList"_s, work}});
    frmMessageList::ShowForm();
    desktop.emplace();
    EXPECT_EQ(lines, (QStringList{u"3 messages"_s, stopped, u"3 messages"_s}));
    EXPECT_EQ(filesIn(gsUnreadPath).size(), 4);
}

TEST_F(Waiting, WhatTakesLongIsNamedWhileItRuns)
{
    QTcpServer silent;
    ASSERT_TRUE(silent.listen(QHostAddress::LocalHost));
    QString seen;
    bool hadPointer = false;
    bool isEscaped = false;
    {
        QSqlDatabase other = QSqlDatabase::addDatabase(u"QSQLITE"_s, u"other"_s);
        other.setDatabaseName(profile::root() + u"/databases/WirSql.db"_s);
        ASSERT_TRUE(other.open());
        QTimer look;
        QObject::connect(&look, &QTimer::timeout, &look, [&] {
            seen += notice();
            hadPointer |= QGuiApplication::overrideCursor() != nullptr;
            if (seen.isEmpty())
                return;
            QSqlQuery(other).exec(u"ROLLBACK"_s);
            while (QTcpSocket* caller = silent.nextPendingConnection())
                caller->abort();
        });
        look.start(10);
        desktop::usePerson();
        setWait(desktop::waitFor);
        const auto write = [] { gConn->execute(u"UPDATE CINFO SET QUOTE_VAL=QUOTE_VAL"_s); };
        const auto writeInALoad = [&] {
            const desktop::WaitPointer pointer(u"Loading m.xml..."_s);
            write();
        };
        const auto connect = [&] {
            const auto text = u"Driver={MySQL};Server=127.0.0.1;Port=%1;Database=x;Uid=sa;Pwd=;"_s;
            db::Connection connection;
            EXPECT_EQ(failureOf([&] { connection.open(text.arg(silent.serverPort())); }), CannotOpen);
        };
        const std::pair<QString, std::function<void()>> cases[] = {{u"Waiting for the database..."_s, write},
                                                                   {u"Loading m.xml..."_s, writeInALoad},
                                                                   {u"Connecting to 127.0.0.1..."_s, connect}};
        for (const auto& [told, work] : cases) {
            QSqlQuery(other).exec(u"BEGIN IMMEDIATE"_s);
            seen.clear();
            hadPointer = false;
            work();
            EXPECT_TRUE(seen.startsWith(told) && hadPointer) << told << seen;
            EXPECT_TRUE(notice().isEmpty() && !QGuiApplication::overrideCursor()) << told;
        }
        look.stop();
        QSqlQuery(other).exec(u"BEGIN IMMEDIATE"_s);
        desktop::Progress progress(u"KEST"_s, u"Reading..."_s, nullptr, desktop::Stop::ByEscape);
        QThread::msleep(501);
        progress.step(0, 1);
        QTimer::singleShot(600, &look, [&] {
            gestures::press(*noticeWindow(), Qt::Key_Escape);
            QSqlQuery(other).exec(u"ROLLBACK"_s);
        });
        gConn->execute(u"UPDATE CINFO SET QUOTE_VAL=QUOTE_VAL"_s);
        isEscaped = !progress.step(1, 2);
    }
    EXPECT_TRUE(isEscaped) << "also while the fill waits for the database";
    QSqlDatabase::removeDatabase(u"other"_s);
    desktop.emplace();
}

TEST_F(Waiting, EachPictureOfAQuoteIsAStep)
{
    QStringList before;
    for (const char* name : {"500_0001.jpg", "500_0002.jpg"})
        files::write(gsImagesPath + QLatin1StringView(name), u"picture"_s);
    setWorkStep([&] { before.append(QString::number(filesIn(gsUnsentPath).size())); });
    writeImageDocuments(gsImagesPath, {u"500"_s, u"0"_s});
    EXPECT_EQ(before, (QStringList{u"0"_s, u"2"_s})) << "a document and a picture each";
}

TEST_F(Waiting, ALongLoadSaysWhatItDoesButNotBesideABox)
{
    quote("500").request("QR1");
    arrive("m.xml", cancellation("QR1"));
    QString seen;
    bool isSlow = false;
    setWorkStep([&] {
        if (std::exchange(isSlow, false))
            QThread::msleep(1001);
        desktop::stillWaiting();
        seen += notice();
    });
    whenShown<QMessageBox>([](QMessageBox& box) {
        EXPECT_EQ(box.text() + notice(), u"Message Loaded"_s);
        box.close();
    });
    desktop::usePerson();
    const Hands hands({{u"frmMessageList"_s, [&](QDialog& window) {
                            isSlow = true;
                            control<QAbstractButton>(window, "cmdProcess").click();
                        }}});
    frmMessageList::ShowForm();
    EXPECT_TRUE(seen.startsWith(u"Loading m.xml..."_s)) << seen;
    EXPECT_EQ(notice(), QString());
    EXPECT_EQ(filesIn(gsUnreadPath), QStringList());
    desktop.emplace();
}

// Tests what the mouse and several selected rows do in the message list.
#include "messagelist/frmMessageList.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "support/Shop.h"

namespace gestures = desktop::gestures;

struct Handling : Shop {
    void work(const Hands::Work& work)
    {
        for (const char* name : {"a", "b", "c"})
            arrive(std::string(name) + ".xml", cancellation(name));
        const Hands hands({{u"frmMessageList"_s, work}});
        frmMessageList::ShowForm();
    }
};

TEST_F(Handling, SeveralRowsAreCopiedButOneIsLoaded)
{
    work([](QDialog& window) {
        gestures::press(window, Qt::CTRL | Qt::Key_A);
        gestures::press(window, Qt::CTRL | Qt::Key_C);
        EXPECT_EQ(QGuiApplication::clipboard()->text().count(u'\n'), 2);
        control<QAbstractButton>(window, "cmdProcess").click();
    });
    EXPECT_EQ(desktop->boxTexts().size(), 1) << "the refusal of one message";
}

TEST_F(Handling, TheNameTellsWhatHappenedWhen)
{
    work([](QDialog& window) {
        QStringList told;
        for (const char* option : {"Option1(0)", "Option1(1)", "Option1(2)"}) {
            files::write(gsReadPath + u"a.xml"_s, cancellation("QR1").text());
            files::write(gsSentPath + u"a.xml"_s, cancellation("QR1").text());
            control<QAbstractButton>(window, option).click();
            const QModelIndex name = control<QTreeView>(window, "ListView1").model()->index(0, 0);
            told << name.data(Qt::ToolTipRole).toString().section(u' ', 0, 1);
        }
        const QString today = QDate::currentDate().toString(u"dd/MM/yyyy"_s);
        EXPECT_EQ(told, (QStringList{u"a.xml\nArrived "_s + today, u"a.xml\nLoaded "_s + today,
                                     u"a.xml\nWritten "_s + today}));
    });
}

TEST_F(Handling, TheColumnsFitTheWindowUntilTheUserChoosesTheirWidth)
{
    work([](QDialog& window) {
        auto& list = control<QTreeView>(window, "ListView1");
        const auto widthAt = [&](int width) {
            window.resize(width, 500);
            gestures::settle();
            EXPECT_EQ(list.horizontalScrollBar()->maximum(), 0) << width;
            return list.header()->sectionSize(1);
        };
        const int usual = widthAt(1500);
        EXPECT_EQ(usual, desktop::pixels(3969));
        EXPECT_LT(widthAt(1000), usual);
        EXPECT_EQ(widthAt(1700), usual);
        list.header()->resizeSection(1, 333);
        EXPECT_EQ(widthAt(1600), 333);
    });
}

TEST_F(Handling, NothingMovesWhenTheFilterAppears)
{
    work([](QDialog& window) {
        const auto places = [&] {
            gestures::settle();
            QStringList all;
            for (const char* name : {"ListView1", "Frame1", "Command6", "txtFind", "cmdExit"}) {
                const auto& widget = control<QWidget>(window, name);
                all << u"%1,%2"_s.arg(widget.x()).arg(widget.y());
            }
            return all.join(u' ');
        };
        const QString before = places();
        control<QAbstractButton>(window, "Option1(1)").click();
        EXPECT_TRUE(control<QWidget>(window, "Frame2").isVisible());
        EXPECT_EQ(places(), before);
    });
}

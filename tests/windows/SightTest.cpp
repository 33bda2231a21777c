// Tests what a person sees on a dark desktop and by the keyboard's focus, and what its status line announces.
#include "platform/desktop/Colours.h"
#include "platform/desktop/PageTools.h"
#include "platform/desktop/StatusLine.h"
#include "platform/script/Gestures.h"
#include "support/Hands.h"
#include "windows/EveryWindow.h"

namespace gestures = desktop::gestures;

constexpr double readableText = 4.5;
constexpr double visiblePicture = 3;

/// Returns how well a widget's text can be read.
static double textContrast(const QWidget& widget)
{
    using Roles = std::pair<QPalette::ColorRole, QPalette::ColorRole>;
    const bool isField = isA<QLineEdit, QAbstractScrollArea, QComboBox>(widget);
    const bool isButton = isA<QPushButton, QToolButton>(widget);
    const auto [text, ground] = isField    ? Roles(QPalette::Text, QPalette::Base)
                                : isButton ? Roles(QPalette::ButtonText, QPalette::Button)
                                           : Roles(QPalette::WindowText, QPalette::Window);
    const QPalette colours = widget.palette();
    double worst = desktop::contrast(colours.color(text), colours.color(ground));
    if (const auto* list = qobject_cast<const QTreeView*>(&widget); list && list->alternatingRowColors())
        worst = std::min(worst, desktop::contrast(colours.color(text), colours.color(QPalette::AlternateBase)));
    if (const auto* editor = qobject_cast<const QPlainTextEdit*>(&widget))
        for (const QTextEdit::ExtraSelection& mark : editor->extraSelections())
            worst = std::min(worst, desktop::contrast(mark.format.foreground().color(), colours.color(QPalette::Base)));
    return worst;
}

/// Returns the best contrast of a pixel of the picture.
static double pictureContrast(const QAbstractButton& button)
{
    const QColor ground = button.palette().color(QPalette::Button);
    QImage picture(24, 24, QImage::Format_RGB32);
    picture.fill(ground);
    QPainter painter(&picture);
    button.icon().paint(&painter, picture.rect());
    double best = 0;
    for (int y = 0; y < picture.height(); ++y)
        for (int x = 0; x < picture.width(); ++x)
            best = std::max(best, desktop::contrast(picture.pixelColor(x, y), ground));
    return best;
}

static void expectReadable(const QDialog& window)
{
    const bool isSystems = !window.objectName().startsWith("frm"_L1);
    for (const QWidget* widget : visible<QWidget>(window)) {
        if (!widget->isEnabled() ||
            !isA<QLabel, QAbstractButton, QLineEdit, QComboBox, QTreeView, QPlainTextEdit>(*widget))
            continue;
        EXPECT_GE(textContrast(*widget), readableText) << nameOf(*widget);
        const auto* button = qobject_cast<const QAbstractButton*>(widget);
        if (button && !button->icon().isNull() && !isSystems) {
            EXPECT_GE(pictureContrast(*button), visiblePicture) << nameOf(*widget);
        }
    }
}

/// Changes the colours of the desktop, and tells it as an application does that runs.
static void setDesktop(const QPalette& colours)
{
    QApplication::setPalette(colours);
    for (QWidget* widget : QApplication::allWidgets()) {
        QEvent change(QEvent::ApplicationPaletteChange);
        QCoreApplication::sendEvent(widget, &change);
    }
}

TEST_F(EveryWindow, CanBeReadInTheColoursOfAnyDesktop)
{
    const QPalette usual = QApplication::palette();
    QPalette stark(Qt::black, Qt::black);
    for (const QPalette::ColorRole role : {QPalette::Text, QPalette::WindowText, QPalette::ButtonText})
        stark.setColor(role, Qt::yellow);
    for (const QPalette& colours : {usual, QPalette(QColor(53, 53, 53), QColor(35, 35, 35)), stark}) {
        QApplication::setPalette(colours);
        SCOPED_TRACE(colours.color(QPalette::Window).name());
        each([&](QDialog& window) {
            gestures::settle();
            expectReadable(window);
            setDesktop(colours == usual ? stark : usual);
            SCOPED_TRACE("after a change");
            gestures::settle();
            expectReadable(window);
            setDesktop(colours);
        });
    }
    QApplication::setPalette(usual);
}

TEST_F(EveryWindow, ShowsWhichControlHasTheFocus)
{
    each([](QDialog& window) {
        const QList<QWidget*> controls = controlsOf(window);
        const auto pictureWithFocusIn = [&](QWidget& control) {
            control.setFocus(Qt::TabFocusReason);
            gestures::settle();
            return window.grab().toImage();
        };
        for (QWidget* control : controls) {
            const auto other = std::ranges::find_if(
                controls, [&](const QWidget* one) { return one != control && one->focusProxy() != control; });
            if (other == controls.end() || !(control->focusPolicy() & Qt::TabFocus))
                continue;
            const QImage without = pictureWithFocusIn(**other);
            const QImage with = pictureWithFocusIn(*control);
            const QRect place(control->mapTo(&window, QPoint()), control->size());
            EXPECT_NE(with.copy(place), without.copy(place)) << nameOf(*control);
        }
    });
}

TEST_F(EveryWindow, OffersItsButtonsInTheMenuOfItsList)
{
    each([](QDialog& window) {
        const QList<QTreeView*> lists = visible<QTreeView>(window);
        for (QTreeView* list : lists + lists) {
            const QPoint place = list->viewport()->rect().center();
            QContextMenuEvent asks(QContextMenuEvent::Mouse, place, list->viewport()->mapToGlobal(place));
            QCoreApplication::sendEvent(list->viewport(), &asks);
            auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
            ASSERT_TRUE(menu);
            EXPECT_TRUE(menu->actions().last()->text().startsWith(u"&Copy"_s));
            for (const QAction* action : menu->actions().first(menu->actions().size() - 1))
                EXPECT_TRUE(std::ranges::any_of(window.findChildren<QPushButton*>(), [&](const QPushButton* button) {
                    return button->text() == action->text() &&
                           action->isEnabled() == (button->isEnabled() && list->selectionModel()->hasSelection());
                })) << action->text();
            menu->close();
            list->clearSelection();  // the second time
        }
    });
}

TEST_F(EveryWindow, AnnouncesWhatItsStatusLineSays)
{
    each([&](QDialog& window) {
        QStringList announced;
        for (desktop::StatusLine* line : window.findChildren<desktop::StatusLine*>()) {
            QObject::connect(line, &desktop::StatusLine::told, &window, [&announced, line](const QString& text) {
                announced.append(text);
                const QAccessibleInterface* heard = QAccessible::queryAccessibleInterface(line);
                EXPECT_EQ(heard->role(), QAccessible::StatusBar);
                EXPECT_EQ(heard->text(QAccessible::Name), text);
            });
            line->tell(u"3 messages"_s);
            line->tell(u"3 messages"_s);
            EXPECT_EQ(announced, QStringList(u"3 messages"_s)) << "once";
        }
        announced.clear();
        if (window.objectName() == "frmMessageList"_L1) {
            control<QLineEdit>(window, "txtFind").setText(u"nothing like it"_s);
            EXPECT_TRUE(announced.value(0).startsWith(u"0 of "_s)) << announced.join(u'|');
            EXPECT_TRUE(control<QToolButton>(window, "cmdHeld").isHidden() ||
                        announced.value(0).endsWith(u", 1 held back (F4)"_s))
                << announced.join(u'|');
            announced.clear();
            arrive("d.xml", cancellation("QR2"));
            gestures::press(window, Qt::Key_F5);
            EXPECT_TRUE(control<QToolButton>(window, "cmdHeld").isHidden() ||
                        announced.last().endsWith(u", 2 held back (F4)"_s))
                << announced.join(u'|');
        } else if (auto* tools = window.findChild<desktop::PageTools*>()) {
            tools->showPage(1, 2);
            tools->showPage(1, 2);
            EXPECT_EQ(announced, QStringList(u"Page 1 of 2"_s));
        } else if (window.objectName() == "frmViewXML"_L1) {
            control<QLineEdit>(window, "txtFind").setText(u"nothing like it"_s);
            gestures::press(window, Qt::Key_F3);
            EXPECT_EQ(announced, QStringList(u"Not found"_s));
        }
        for (desktop::StatusLine* line : window.findChildren<desktop::StatusLine*>())
            line->disconnect(&window);
    });
}

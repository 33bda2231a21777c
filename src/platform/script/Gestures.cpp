#include "platform/script/Gestures.h"

#include "platform/script/Refusal.h"

#include <QAbstractButton>
#include <QApplication>
#include <QElapsedTimer>
#include <QScrollArea>
#include <QStyleHints>
#include <QThread>
#include <QWindow>

// Exported by QtGui for tools that inject events at the point where those of the system enter.
QT_BEGIN_NAMESPACE
Q_GUI_EXPORT void qt_handleMouseEvent(QWindow* window, const QPointF& local, const QPointF& global,
                                      Qt::MouseButtons state, Qt::MouseButton button, QEvent::Type type,
                                      Qt::KeyboardModifiers modifiers, int timestamp);
Q_GUI_EXPORT void qt_handleKeyEvent(QWindow* window, QEvent::Type type, int key, Qt::KeyboardModifiers modifiers,
                                    const QString& text, bool autorepeat, ushort count);
QT_END_NAMESPACE

namespace kest::desktop::gestures {

using namespace Qt::StringLiterals;

namespace {

// Milliseconds.
constexpr int longestActivation = 1000;  // for a slow window manager
constexpr int longestPress = 500;        // how long an access key may hold a button down
constexpr int pollInterval = 5;

int eventTime = 0;  // milliseconds; clicks of different steps are so far apart that they never make a double click

void pressAndRelease(QWidget& window, QPoint point)
{
    const QPointF global = window.mapToGlobal(point);
    eventTime += 10;
    qt_handleMouseEvent(window.windowHandle(), point, global, Qt::LeftButton, Qt::LeftButton, QEvent::MouseButtonPress,
                        Qt::NoModifier, eventTime);
    eventTime += 10;
    qt_handleMouseEvent(window.windowHandle(), point, global, Qt::NoButton, Qt::LeftButton, QEvent::MouseButtonRelease,
                        Qt::NoModifier, eventTime);
}

void scrollTo(QWidget& control)
{
    for (QWidget* above = control.parentWidget(); above; above = above->parentWidget())
        if (auto* area = qobject_cast<QScrollArea*>(above))
            area->ensureWidgetVisible(&control);
}

/// Returns the point in the window's coordinates. Throws a Refusal if another control covers it.
QPoint reachablePoint(QWidget& control, QPoint at)
{
    checkUsable(control);
    scrollTo(control);
    QWidget* window = control.window();
    const QPoint point = control.mapTo(window, at);
    const QWidget* hit = window->childAt(point);
    if (hit != &control && !control.isAncestorOf(hit) && window != &control)
        throw Refusal(hit ? u"the control is covered by "_s + hit->objectName() : u"the control is out of reach"_s);
    return point;
}

/// Makes the window the active one even without an event: a window that was hidden and shown again may still have the
/// system's focus, and then the system sends none.
void makeActive(QWidget& window)
{
    QT_WARNING_PUSH
    QT_WARNING_DISABLE_DEPRECATED
    QApplication::setActiveWindow(&window);
    QT_WARNING_POP
}

/// Waits until no button is down: a button that was pressed by its access key is released, and acts, a moment later.
void letButtonsComeUp(const QWidget& window)
{
    const auto isDown = [&] {
        return std::ranges::any_of(window.findChildren<QAbstractButton*>(), &QAbstractButton::isDown);
    };
    QElapsedTimer time;
    time.start();
    while (isDown() && time.elapsed() < longestPress) {
        QThread::msleep(pollInterval);
        settle();
    }
}

void key(QWidget& window, int code, Qt::KeyboardModifiers modifiers, const QString& text)
{
    for (const QEvent::Type type : {QEvent::KeyPress, QEvent::KeyRelease})
        qt_handleKeyEvent(window.windowHandle(), type, code, modifiers, text, false, 1);
}

QString textOf(QKeyCombination combination)
{
    if (combination.keyboardModifiers() & (Qt::ControlModifier | Qt::AltModifier | Qt::MetaModifier))
        return {};
    switch (combination.key()) {
        case Qt::Key_Return:
        case Qt::Key_Enter:
            return u"\r"_s;
        case Qt::Key_Tab:
            return u"\t"_s;
        case Qt::Key_Backspace:
            return u"\b"_s;
        case Qt::Key_Delete:
            return u"\x7f"_s;
        case Qt::Key_Escape:
            return u"\x1b"_s;
        default:
            break;
    }
    if (combination.key() > 0xffff)
        return {};
    const QChar character(static_cast<char16_t>(combination.key()));
    return combination.keyboardModifiers() & Qt::ShiftModifier ? QString(character) : QString(character.toLower());
}

}  // namespace

void settle()
{
    QCoreApplication::sendPostedEvents();
    QCoreApplication::processEvents();
}

void activate(QWidget& window)
{
    settle();
    QElapsedTimer time;
    time.start();
    while (window.isVisible() && !window.isActiveWindow() && time.elapsed() < longestActivation) {
        window.activateWindow();
        settle();
        if (QGuiApplication::focusWindow() == window.windowHandle())
            makeActive(window);
        else
            QThread::msleep(pollInterval);
    }
}

void checkUsable(const QWidget& control)
{
    if (!control.isVisible())
        throw Refusal(u"the control is hidden"_s);
    if (!control.isEnabled())
        throw Refusal(u"the control is disabled"_s);
}

void click(QWidget& control, QPoint at)
{
    const QPoint point = reachablePoint(control, at);
    eventTime += 2 * QGuiApplication::styleHints()->mouseDoubleClickInterval();
    pressAndRelease(*control.window(), point);
}

void doubleClick(QWidget& control, QPoint at)
{
    click(control, at);
    const QPoint point = reachablePoint(control, at);
    pressAndRelease(*control.window(), point);
}

void focus(QWidget& control)
{
    checkUsable(control);
    const auto hasFocus = [&] {
        const QWidget* focused = QApplication::focusWidget();
        return focused && (focused == &control || focused == control.focusProxy() || control.isAncestorOf(focused));
    };
    if (!hasFocus())
        control.setFocus(Qt::OtherFocusReason);
    if (!hasFocus())
        throw Refusal(u"the control takes no keys"_s);
}

void press(QWidget& window, QKeyCombination combination)
{
    const bool back = combination.key() == Qt::Key_Tab && combination.keyboardModifiers() == Qt::ShiftModifier;
    key(window, back ? Qt::Key_Backtab : combination.key(), combination.keyboardModifiers(), textOf(combination));
    letButtonsComeUp(window);
}

void type(QWidget& window, const QString& text)
{
    const QString typed = QString(text).replace(u"\r\n"_s, u"\n"_s);
    for (qsizetype at = 0; at < typed.size(); ++at) {
        const QChar character = typed[at];
        if (character == u'\n' || character == u'\r') {
            press(window, Qt::Key_Return);
        } else if (character.isHighSurrogate() && at + 1 < typed.size()) {
            key(window, Qt::Key_unknown, Qt::NoModifier, typed.mid(at++, 2));
        } else {
            const Qt::KeyboardModifiers shift = character.isUpper() ? Qt::ShiftModifier : Qt::NoModifier;
            const int code = character == u'\t' ? int(Qt::Key_Tab) : character.toUpper().unicode();
            key(window, code, shift, character);
        }
    }
}

}  // namespace kest::desktop::gestures

#include "platform/desktop/Progress.h"

#include "platform/Prompt.h"
#include "platform/desktop/InputBlock.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QDeadlineTimer>
#include <QLabel>
#include <QLayout>
#include <QProgressBar>
#include <QVBoxLayout>
#include <QWindow>

#include <optional>

namespace kest::desktop {

namespace {

// Milliseconds.
constexpr int quiet = 500;       // an operation shorter than this shows no progress
constexpr int explained = 1000;  // a longer one says what it does
constexpr int repaintInterval = 50;
constexpr int longestExposure = 200;  // how long to wait until the window is on the screen
constexpr int pollInterval = 10;

constexpr int steps = 100;

enum class Bar { Absent, Present };  // a progress bar

struct Wait {
    QString what;  // empty while a box or a window is up
    Bar bar;       // which says it
    QElapsedTimer since;
    int waited;  // milliseconds, before `since`
};
QList<Wait> waits;  // the last one is the innermost
std::unique_ptr<QWidget> notice;

void beginWait(const QString& what, Bar bar = Bar::Absent, int waited = 0)
{
    Wait wait{what, bar, {}, waited};
    wait.since.start();
    waits.append(wait);
}

void endWait()
{
    waits.removeLast();
}

/// Removes a window from the screen at once: what follows may process no events for a while.
void takeAway(std::unique_ptr<QWidget>& window)
{
    if (!window)
        return;
    window.reset();
    QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);
}

std::unique_ptr<QWidget> makeWindow(const QString& caption, const QString& what, Bar wanted)
{
    auto window = std::make_unique<QWidget>(nullptr, Qt::Dialog | Qt::CustomizeWindowHint | Qt::WindowTitleHint);
    window->setWindowTitle(caption);
    auto* layout = new QVBoxLayout(window.get());
    auto* label = new QLabel(what);
    label->setTextFormat(Qt::PlainText);
    layout->addWidget(label);
    if (wanted == Bar::Present) {
        auto* bar = new QProgressBar;
        bar->setAccessibleName(what);
        layout->addWidget(bar);
    }
    window->setMinimumWidth(pixels(4500));
    return window;
}

void putOnScreen(QWidget& window)
{
    const QWidget* caller = QApplication::activeWindow();
    window.winId();
    if (caller && caller->windowHandle())
        window.windowHandle()->setTransientParent(caller->windowHandle());
    giveIcon(window);
    window.adjustSize();
    centre(window);
    window.show();
    QElapsedTimer time;
    time.start();
    while (!window.windowHandle()->isExposed() && time.elapsed() < longestExposure)
        QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents, pollInterval);
    window.repaint();
}

}  // namespace

WaitPointer::WaitPointer(const QString& what, int waited)
{
    QGuiApplication::setOverrideCursor(Qt::WaitCursor);
    beginWait(what, Bar::Absent, waited);
}

WaitPointer::~WaitPointer()
{
    endWait();
    takeAway(notice);
    QGuiApplication::restoreOverrideCursor();
}

void stillWaiting()
{
    if (notice || waits.isEmpty() || !isPersonPresent())
        return;
    const Wait& wait = waits.last();
    if (wait.what.isEmpty() || wait.bar == Bar::Present || wait.since.elapsed() + wait.waited < explained)
        return;
    notice = makeWindow(defaultTitle(), wait.what, Bar::Absent);
    putOnScreen(*notice);
}

void waitFor(const QString& what, const std::function<bool()>& isDone)
{
    const QDeadlineTimer shortWait(quiet);  // in which what is typed stays for later
    while (!shortWait.hasExpired()) {
        if (isDone())
            return;
    }
    const InputBlock block;
    std::optional<WaitPointer> pointer;
    if (waits.isEmpty() || waits.last().what.isEmpty())  // otherwise it is part of what the user is waiting for
        pointer.emplace(what, quiet);
    while (!isDone()) {
        stillWaiting();
        QCoreApplication::processEvents();
    }
}

OrdinaryPointer::OrdinaryPointer() : wasOther(QGuiApplication::overrideCursor())
{
    beginWait({});
    takeAway(notice);
    if (wasOther)
        QGuiApplication::setOverrideCursor(Qt::ArrowCursor);
}

OrdinaryPointer::~OrdinaryPointer()
{
    endWait();
    for (Wait& wait : waits) {
        wait.since.start();
        wait.waited = 0;
    }
    if (wasOther)
        QGuiApplication::restoreOverrideCursor();
}

Progress::Progress(const QString& windowCaption, const QString& work, QProgressBar* windowBar, Stop stop)
    : caption(windowCaption), what(work), bar(windowBar)
{
    since.start();
    canStop = stop == Stop::ByEscape && isPersonPresent();
}

Progress::~Progress()
{
    if (input)
        QCoreApplication::processEvents();  // what was typed until now is lost, too
    if (!shown)
        return;
    endWait();
    QGuiApplication::restoreOverrideCursor();
    if (bar && !ownWindow)
        bar->hide();
    if (input)
        takeAway(ownWindow);
}

bool Progress::step(qint64 done, qint64 total)
{
    if (!shown && since.elapsed() > quiet)
        show();
    if (bar && shown && total > 0)
        bar->setValue(static_cast<int>(done * steps / total));
    if (shown && canStop && !input)
        input = std::make_unique<InputBlock>();  // what is typed during a short fill stays for later
    if (input && (!sinceEvents.isValid() || sinceEvents.hasExpired(repaintInterval))) {
        QCoreApplication::processEvents();
        sinceEvents.start();
    }
    return !input || !input->isEscaped();
}

void Progress::show()
{
    shown = true;
    beginWait(what, Bar::Present);
    takeAway(notice);
    QGuiApplication::setOverrideCursor(Qt::WaitCursor);
    if (bar && bar->window()->isVisible()) {
        bar->show();
        if (QLayout* layout = bar->window()->layout())
            layout->activate();
    } else if (isPersonPresent()) {
        ownWindow = makeWindow(caption, what, Bar::Present);
        bar = ownWindow->findChild<QProgressBar*>();
        putOnScreen(*ownWindow);
    } else {
        bar = nullptr;
    }
    if (bar)
        bar->setRange(0, steps);
}

}  // namespace kest::desktop

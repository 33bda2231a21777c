#include "platform/desktop/Progress.h"

#include "platform/Prompt.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QLabel>
#include <QLayout>
#include <QProgressBar>
#include <QVBoxLayout>
#include <QWindow>

namespace kest::desktop {

namespace {

// Milliseconds.
constexpr int quiet = 500;            // an operation shorter than this shows no progress
constexpr int longestExposure = 200;  // how long to wait until the window is on the screen
constexpr int pollInterval = 10;

constexpr int steps = 100;

std::unique_ptr<QWidget> makeWindow(const QString& caption, const QString& what)
{
    auto window = std::make_unique<QWidget>(nullptr, Qt::Dialog | Qt::CustomizeWindowHint | Qt::WindowTitleHint);
    window->setWindowTitle(caption);
    auto* layout = new QVBoxLayout(window.get());
    layout->addWidget(new QLabel(what));
    auto* bar = new QProgressBar;
    bar->setAccessibleName(what);
    layout->addWidget(bar);
    window->setMinimumWidth(pixels(4500));
    return window;
}

void putOnScreen(QWidget& window)
{
    const QWidget* caller = QApplication::activeWindow();
    window.winId();
    if (caller && caller->windowHandle())
        window.windowHandle()->setTransientParent(caller->windowHandle());
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

WaitPointer::WaitPointer()
{
    QGuiApplication::setOverrideCursor(Qt::WaitCursor);
}

WaitPointer::~WaitPointer()
{
    QGuiApplication::restoreOverrideCursor();
}

OrdinaryPointer::OrdinaryPointer() : wasOther(QGuiApplication::overrideCursor())
{
    if (wasOther)
        QGuiApplication::setOverrideCursor(Qt::ArrowCursor);
}

OrdinaryPointer::~OrdinaryPointer()
{
    if (wasOther)
        QGuiApplication::restoreOverrideCursor();
}

Progress::Progress(const QString& windowCaption, const QString& work, QProgressBar* windowBar)
    : caption(windowCaption), what(work), bar(windowBar)
{
    since.start();
}

Progress::~Progress()
{
    if (!shown)
        return;
    QGuiApplication::restoreOverrideCursor();
    if (bar && !ownWindow)
        bar->hide();
}

void Progress::step(qint64 done, qint64 total)
{
    if (!shown && since.elapsed() > quiet)
        show();
    if (bar && shown && total > 0)
        bar->setValue(static_cast<int>(done * steps / total));
}

void Progress::show()
{
    shown = true;
    QGuiApplication::setOverrideCursor(Qt::WaitCursor);
    if (bar && bar->window()->isVisible()) {
        bar->show();
        if (QLayout* layout = bar->window()->layout())
            layout->activate();
    } else if (isPersonPresent()) {
        ownWindow = makeWindow(caption, what);
        bar = ownWindow->findChild<QProgressBar*>();
        putOnScreen(*ownWindow);
    } else {
        bar = nullptr;
    }
    if (bar)
        bar->setRange(0, steps);
}

}  // namespace kest::desktop

#include "platform/desktop/Window.h"

#include "platform/desktop/Progress.h"
#include "platform/desktop/WindowLayout.h"

#include <QApplication>
#include <QFontMetricsF>
#include <QIcon>
#include <QImageReader>
#include <QPixmap>
#include <QPointer>
#include <QScreen>
#include <QWindow>

#include <algorithm>
#include <exception>

namespace kest::desktop {

namespace {

constexpr double twipsPerInch = 1440;
constexpr int titleBar = 450;  // twips, an estimate: the system gives the height only after the window is shown

std::shared_ptr<WindowDriver> windowDriver;
FailureReporter failureReporter;
std::exception_ptr kept;
QList<QDialog*> shownWindows;  // the last one is on top

void keep(const std::exception_ptr& exception)
{
    if (!kept)
        kept = exception;
    if (!shownWindows.isEmpty())
        shownWindows.last()->hide();  // ends its event loop even if closeEvent() would refuse
}

class Shown {
public:
    explicit Shown(QDialog& window)
        : caller(shownWindows.isEmpty() ? QApplication::activeWindow() : shownWindows.last())
    {
        shownWindows.append(&window);
        window.winId();  // creates the system's window
        if (caller && caller->windowHandle())
            window.windowHandle()->setTransientParent(caller->windowHandle());  // keeps it on top of its caller
    }
    ~Shown()
    {
        shownWindows.removeLast();
        if (caller && caller->isVisible())
            caller->activateWindow();
    }
    Q_DISABLE_COPY_MOVE(Shown)

private:
    QPointer<QWidget> caller;
};

/// Returns the pixels in a twip at the screen's resolution, scaled up if the font is larger than usual.
double scale()
{
    constexpr double usualLine = 270;  // twips; the line height of a usual font
    const QScreen* screen = QGuiApplication::primaryScreen();
    const double ofScreen = (screen ? screen->logicalDotsPerInch() : 96) / twipsPerInch;
    return std::max(ofScreen, QFontMetricsF(QApplication::font()).height() / usualLine);
}

}  // namespace

void showModal(QDialog& window)
{
    throwKept();
    if (!window.testAttribute(Qt::WA_Resized))
        window.adjustSize();
    window.resize(window.size().boundedTo(window.screen()->availableSize() - pixels(0, titleBar)));
    WindowLayout layout(window);
    giveIcon(window);
    centre(window);
    {
        const Shown shown(window);
        const OrdinaryPointer pointer;
        const std::shared_ptr<WindowDriver> driver = windowDriver;
        const bool isDriven = driver && driver->drive(window);
        if (!isDriven) {
            window.exec();
            QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);  // a long operation may follow
        }
        if (!isDriven || driver->isLikeAPerson())
            layout.remember();
    }
    throwKept();
}

void setWindowDriver(std::shared_ptr<WindowDriver> driver)
{
    windowDriver = std::move(driver);
}

void setFailureReporter(FailureReporter reporter)
{
    failureReporter = std::move(reporter);
}

void guarded(const QString& source, const std::function<void()>& event)
{
    if (kept)
        return;
    try {
        try {
            event();
        } catch (const RuntimeError& error) {
            if (!failureReporter)
                throw;
            attempt([&] { failureReporter(error, source); });  // it shows its box before it can fail
        }
    } catch (...) {
        keep(std::current_exception());
    }
}

void throwKept()
{
    if (kept)
        std::rethrow_exception(std::exchange(kept, nullptr));
}

int pixels(int twips)
{
    return qRound(twips * scale());
}

QSize pixels(int widthTwips, int heightTwips)
{
    return {pixels(widthTwips), pixels(heightTwips)};
}

int twips(int pixels)
{
    return qRound(pixels / scale());
}

void giveIcon(QWidget& window)
{
    QImageReader picture(QStringLiteral(":/kest2.png"), "png");
    picture.setAutoDetectImageFormat(false);  // this would load the libraries of all other formats
    window.setWindowIcon(QPixmap::fromImage(picture.read()));
}

void centre(QWidget& window)
{
    const QRect screen = window.screen()->availableGeometry();
    const QSize room = screen.size() - window.frameGeometry().size();
    window.move(screen.topLeft() +
                QPoint(qMax(room.width(), 0), qMax(room.height(), 0)) / 2);  // the title bar is always visible
}

}  // namespace kest::desktop

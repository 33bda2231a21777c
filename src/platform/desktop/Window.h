// Shows modal windows and guards their events against exceptions.
#pragma once

#include "platform/RuntimeError.h"

#include <QDialog>
#include <QObject>
#include <QSize>
#include <QString>

#include <functional>
#include <memory>

namespace kest::desktop {

/// Shows the window modally, centred on the screen, and returns when it has been closed. If a window driver is set, it
/// operates the window. The size of the window and the column widths of its lists are saved in the profile, unless a
/// script has operated it.
void showModal(QDialog& window);

/// Operates windows in place of a person.
class WindowDriver {
public:
    virtual ~WindowDriver() = default;
    /// Operates the shown window. Returns false if a person should do it instead.
    virtual bool drive(QDialog& window) = 0;
    /// Returns true if the layout of a window that it has operated is saved, as that of a person is.
    virtual bool isLikeAPerson() const { return false; }
};
/// Sets the driver of all windows; null leaves them to a person.
void setWindowDriver(std::shared_ptr<WindowDriver> driver);

/// Reports an error that no routine has caught; `source` is "window.control_event".
using FailureReporter = std::function<void(const RuntimeError&, const QString& source)>;
/// Sets the function that guarded() reports errors with.
void setFailureReporter(FailureReporter reporter);

/// Runs an event of a window. If the event throws a RuntimeError, reports it and leaves the window open.
///
/// Keeps any other exception, which ends an unattended command, until showModal() throws it again outside of Qt's event
/// code. Until then no further event runs.
void guarded(const QString& source, const std::function<void()>& event);
/// Throws the exception that guarded() has kept, if any. For code that operates controls without showing their window.
void throwKept();

/// Calls a routine with these arguments, or without any if it takes none.
template <class Routine, class... Arguments>
void callWith(const Routine& routine, const Arguments&... arguments)
{
    if constexpr (requires { routine(arguments...); })
        routine(arguments...);
    else
        routine();
}
/// Connects a signal to an event routine, which runs through guarded().
template <class Sender, class Signal, class Routine>
void onEvent(Sender* sender, Signal signal, QObject* window, const QString& source, Routine routine)
{
    QObject::connect(sender, signal, window, [source, routine](auto&&... arguments) {
        guarded(source, [&] { callWith(routine, arguments...); });
    });
}

/// Converts between twips (1/1440 inch) and pixels at the screen's logical resolution. If the font is larger than
/// usual, a twip is larger too.
int pixels(int twips);
QSize pixels(int widthTwips, int heightTwips);
int twips(int pixels);

/// Gives the window the icon of the application.
void giveIcon(QWidget& window);

/// Moves the window to the centre of its screen.
void centre(QWidget& window);

}  // namespace kest::desktop

// Modal windows and their events: the one guard for slots, the one way to show a window.
#pragma once

#include "platform/RuntimeError.h"

#include <QDialog>
#include <QObject>
#include <QSize>
#include <QString>

#include <functional>
#include <memory>

namespace kest::desktop {

/// Shows the window modally, centred on the screen, and returns when it has been closed. A script drives it where one
/// answers for its objectName. Its size, and the column widths of its lists, are remembered in the profile.
void showModal(QDialog& window);

/// Whoever drives windows in place of a person; `false` leaves the window to the person.
class WindowDriver {
public:
    virtual ~WindowDriver() = default;
    virtual bool drive(QDialog& window) = 0;
};
void setWindowDriver(std::shared_ptr<WindowDriver> driver);

/// Puts a person in charge: boxes and input boxes are real windows, and windows wait for their user.
void usePerson();

/// Reports a failure that nobody trapped in a slot; `source` is "window.control_event".
using FailureReporter = std::function<void(const RuntimeError&, const QString& source)>;
void setFailureReporter(FailureReporter reporter);

/// Runs one event of a window: a RuntimeError that nobody trapped is reported and the window stays open. What ends an
/// unattended command is kept, and thrown again by `showModal` outside of Qt's event code. While something is kept no
/// further event runs.
void guarded(const QString& source, const std::function<void()>& event);
/// Throws what `guarded` has kept. For code that lets controls act without showing their window.
void throwKept();

/// Connects a signal to an event routine through the guard.
template <class Sender, class Signal, class Routine>
void onEvent(Sender* sender, Signal signal, QObject* window, const QString& source, Routine routine)
{
    QObject::connect(sender, signal, window, [source, routine](auto&&... arguments) {
        guarded(source, [&] {
            if constexpr (requires { routine(arguments...); })
                routine(arguments...);
            else
                routine();
        });
    });
}

/// Sizes in twips (1/1440 inch) as pixels, and back: at the screen's logical resolution, larger where the font is.
int pixels(int twips);
QSize pixels(int widthTwips, int heightTwips);
int twips(int pixels);

/// Moves the window's middle to the middle of its screen.
void centre(QWidget& window);

}  // namespace kest::desktop

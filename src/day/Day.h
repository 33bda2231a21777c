// A working day of the demo shop: what the insurer, the estimator and the clerk do, step by step.
#pragma once

#include "loopback/Transport.h"
#include "platform/script/Script.h"
#include "shell/eKEST.h"

#include <QString>
#include <QStringList>

#include <functional>

namespace kest::app {

/// Plays the steps on a new demo shop. A step is a file whose name begins with its number:
///
///   .rules  the insurer's rules: the day begins with an empty unread folder, and KESTWeb's window opens
///   .sql    what the estimator writes in the host application
///   .json   a script for the windows; its name ends in the number of the quote for which the panel opens
///
/// The transport runs once after each step.
class Day {
public:
    /// `pictures` is the folder for pictures of the windows and of each report's first page, a path of this system.
    explicit Day(const QString& pictures);

    /// Returns the names of all steps in order.
    static QStringList steps();

    /// Plays a step and returns what it showed. Throws RuntimeError if the step fails.
    desktop::Record play(const QString& step);

private:
    void beginWith(const QString& rules);
    /// Opens windows that a script operates, and returns what they showed.
    desktop::Record driven(const QString& script, const std::function<void()>& windows) const;
    void takePictures(const QString& step);
    void carry();

    QString pictures;
    eKEST component;
    Transport transport;
};

}  // namespace kest::app

// One working day of the demo shop: what the insurer, the estimator and the clerk do, step by step.
#pragma once

#include "loopback/Transport.h"
#include "platform/script/Script.h"
#include "shell/eKEST.h"

#include <QString>
#include <QStringList>

#include <functional>

namespace kest::app {

/// Plays the steps on a demo shop that is as it was made. A step is a file whose name begins with its number:
/// `.rules` the insurer's rules, with which the day begins on an empty unread folder and KESTWeb's window opens; `.sql`
/// what the estimator writes in the host application; `.json` the script that drives the windows, with the number of
/// the quote that the panel is opened on at the end of its name. After each step the transport carries once.
class Day {
public:
    /// `pictures` is a folder of this system for the pictures of the windows and of each report's first page.
    explicit Day(const QString& pictures);

    /// The names of all steps, in order.
    static QStringList steps();

    /// Plays one step, and gives what it showed. Throws where a step cannot be done.
    desktop::Record play(const QString& step);

private:
    void beginWith(const QString& rules);
    /// Runs windows that a script drives, and gives what they showed.
    desktop::Record driven(const QString& script, const std::function<void()>& windows) const;
    void takePictures(const QString& step);
    void carry();

    QString pictures;
    eKEST component;
    Transport transport;
};

}  // namespace kest::app

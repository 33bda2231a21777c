// Shows the progress of a long operation.
#pragma once

#include <QElapsedTimer>
#include <QPointer>
#include <QString>

#include <functional>
#include <memory>

class QProgressBar;
class QWidget;

namespace kest::desktop {

class InputBlock;

/// Shows the wait cursor until the object is destroyed, and after a second what the user is waiting for.
class WaitPointer {
public:
    /// `what` is a sentence, such as "Loading QREQ_1.xml...". `waited` milliseconds have already passed.
    explicit WaitPointer(const QString& what, int waited = 0);
    ~WaitPointer();
    Q_DISABLE_COPY_MOVE(WaitPointer)
};

/// Shows what the innermost WaitPointer is for, if it is older than a second. Long operations call this between their
/// steps, because no event is processed meanwhile.
void stillWaiting();

/// Waits until `isDone` returns true, which may itself take some milliseconds. After half a second the wait cursor
/// appears, and windows are repainted but take no input. After a second the user sees `what`, or, if it is part of a
/// longer operation, what that one does.
void waitFor(const QString& what, const std::function<bool()>& isDone);

/// Shows the normal cursor, and nothing to wait for, while a box or a window is up: a long operation that opens one is
/// itself waiting for the user.
class OrdinaryPointer {
public:
    OrdinaryPointer();
    ~OrdinaryPointer();
    Q_DISABLE_COPY_MOVE(OrdinaryPointer)

private:
    bool wasOther;
};

/// If Esc ends the operation.
enum class Stop { Never, ByEscape };

/// Shows a progress bar and the wait cursor after half a second, until the object is destroyed.
///
/// Uses `bar` if it is visible, and otherwise a small window of its own. With a script no window is shown.
///
/// With Stop::ByEscape all windows are repainted from then on. They take no key except Esc and no click, and what is
/// typed and clicked is lost. Otherwise no event is processed.
class Progress {
public:
    Progress(const QString& caption, const QString& what, QProgressBar* bar = nullptr, Stop stop = Stop::Never);
    ~Progress();
    Q_DISABLE_COPY_MOVE(Progress)

    /// Call this after each step of the operation. Returns false if the user has stopped it.
    bool step(qint64 done, qint64 total);
    /// Returns true if half a second has passed.
    bool isShown() const { return shown; }

private:
    void show();

    QElapsedTimer since;
    QString caption;
    QString what;
    QPointer<QProgressBar> bar;
    std::unique_ptr<QWidget> ownWindow;
    std::unique_ptr<InputBlock> input;
    QElapsedTimer sinceEvents;
    bool canStop = false;
    bool shown = false;
};

}  // namespace kest::desktop

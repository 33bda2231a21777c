// Shows the progress of a long operation.
#pragma once

#include <QElapsedTimer>
#include <QPointer>
#include <QString>

#include <memory>

class QProgressBar;
class QWidget;

namespace kest::desktop {

/// Shows the wait cursor until the object is destroyed.
class WaitPointer {
public:
    WaitPointer();
    ~WaitPointer();
    Q_DISABLE_COPY_MOVE(WaitPointer)
};

/// Shows the normal cursor while a box or a window is up: a long operation that opens one is itself waiting for the
/// user.
class OrdinaryPointer {
public:
    OrdinaryPointer();
    ~OrdinaryPointer();
    Q_DISABLE_COPY_MOVE(OrdinaryPointer)

private:
    bool wasOther;
};

/// Shows a progress bar and the wait cursor after half a second, until the object is destroyed.
///
/// Uses `bar` if it is visible, and otherwise a small window of its own. With a script no window is shown. The bar is
/// repainted without processing events, so nothing that the user types or clicks meanwhile is handled in between.
class Progress {
public:
    Progress(const QString& caption, const QString& what, QProgressBar* bar = nullptr);
    ~Progress();
    Q_DISABLE_COPY_MOVE(Progress)

    /// Call this after each step of the operation.
    void step(qint64 done, qint64 total);

private:
    void show();

    QElapsedTimer since;
    QString caption;
    QString what;
    QPointer<QProgressBar> bar;
    std::unique_ptr<QWidget> ownWindow;
    bool shown = false;
};

}  // namespace kest::desktop

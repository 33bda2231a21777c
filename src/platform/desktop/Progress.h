// Shows how far a work is that keeps a person waiting.
#pragma once

#include <QElapsedTimer>
#include <QPointer>
#include <QString>

#include <memory>

class QProgressBar;
class QWidget;

namespace kest::desktop {

/// Seen once the work has taken half a second, with the pointer of waiting: in the bar of a window, or, where that is
/// not to be seen, in a small window of its own, unless a script stands in for the person. Gone with the object. It
/// paints itself, so that nothing that the user types or clicks gets in between.
class Progress {
public:
    Progress(const QString& caption, const QString& what, QProgressBar* bar = nullptr);
    ~Progress();
    Q_DISABLE_COPY_MOVE(Progress)

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

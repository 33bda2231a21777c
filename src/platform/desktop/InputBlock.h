// Swallows keys and clicks during a long operation that repaints its windows.
#pragma once

#include <QObject>
#include <QPointer>
#include <QWidget>

namespace kest::desktop {

/// While it exists, all windows ignore keys, clicks, drops and their close box. A box that is opened meanwhile works as
/// usual.
class InputBlock final : public QObject {
    Q_OBJECT
public:
    InputBlock();
    ~InputBlock() override;

    /// Returns true if Esc was pressed, even if it was while a block of a shorter operation existed, too.
    bool isEscaped() const { return escaped; }

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    QPointer<QWidget> modal;
    bool escaped = false;
};

}  // namespace kest::desktop

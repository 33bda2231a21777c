// A line of a window that says what has happened.
#pragma once

#include <QLabel>

namespace kest::desktop {

/// A line of plain text. To screen readers it is a status bar.
class StatusLine final : public QLabel {
    Q_OBJECT
public:
    /// `name` becomes the objectName.
    explicit StatusLine(const QString& name);

    /// Shows a text and, unless it is the one that is shown, announces it to screen readers. setText() announces
    /// nothing.
    void tell(const QString& text);

signals:
    /// A text was announced.
    void told(const QString& text);
};

}  // namespace kest::desktop

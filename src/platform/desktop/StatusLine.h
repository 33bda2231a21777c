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
    /// nothing. `beside` is what stands beside the line, which only a screen reader needs to be told.
    void tell(const QString& text, const QString& beside = {});
    /// Returns what a screen reader says.
    QString spoken() const { return besideIt.isEmpty() ? text() : text() + QStringLiteral(", ") + besideIt; }

signals:
    /// A text was announced.
    void told(const QString& spoken);

private:
    QString besideIt;
};

}  // namespace kest::desktop

// The base class of all windows.
#pragma once

#include <QDialog>
#include <QString>

class QPushButton;

namespace kest::desktop {

/// A modal window whose title bar has only the close box. Escape acts as the close box, so that both go through
/// closeEvent(). No button is the automatic default: Enter presses a button only if it was made the default.
class Form : public QDialog {
    Q_OBJECT
public:
    /// `name` becomes the objectName, by which scripts and WindowLayout know the window.
    Form(const QString& name, const QString& caption);

protected:
    void keyPressEvent(QKeyEvent* event) override;
    void showEvent(QShowEvent* event) override;
};

/// Creates a button with an exit picture and the shortcut Alt+X. `tip` is its tool tip and its accessible name.
QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip = QStringLiteral("Close"));

/// Returns the arrow of a combo box in the colour of the text.
QIcon dropArrow(const QPalette& palette);

}  // namespace kest::desktop

// The base class of all windows.
#pragma once

#include <QDialog>
#include <QString>

#include <functional>

class QPushButton;

namespace kest::desktop {

/// A modal window whose title bar has only the close box. Escape acts as the close box, so that both go through
/// closeEvent(). Enter presses the button that has the focus, and otherwise the default button if there is one. F1
/// shows the box "About KEST2".
class Form : public QDialog {
    Q_OBJECT
public:
    /// `name` becomes the objectName, by which scripts and WindowLayout know the window.
    Form(const QString& name, const QString& caption);

protected:
    void keyPressEvent(QKeyEvent* event) override;
    void showEvent(QShowEvent* event) override;

    /// Fits the window to its layout, so that it can't be stretched.
    void fixSize();
};

/// Sets the function that returns the text of the box "About KEST2".
void setAbout(std::function<QString()> text);
/// Shows the box "About KEST2".
void showAbout();

/// Creates a button with an exit picture and the shortcut Alt+X. `tip` is its tool tip and its accessible name.
QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip = QStringLiteral("Close"));

/// Returns the arrow of a combo box, as the style draws it.
QIcon dropArrow(const QPalette& palette);

}  // namespace kest::desktop

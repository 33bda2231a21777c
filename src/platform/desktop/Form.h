// The base class of all windows.
#pragma once

#include "platform/desktop/Window.h"

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
    void changeEvent(QEvent* event) override;

    /// Sets the colours that the window has chosen itself again, after the desktop has changed its own.
    virtual void chooseColours() {}

    /// Fits the window to its layout, so that it can't be stretched.
    void fixSize();

    /// Connects a signal to an event routine. An error in it is reported with the source "WINDOW.EVENT".
    template <class Sender, class Signal, class Routine>
    void on(Sender* sender, Signal signal, const QString& event, Routine routine)
    {
        onEvent(sender, signal, this, objectName() + u'.' + event, routine);
    }
    /// Creates a button. A click on it is the event "NAME_Click".
    QPushButton* button(const QString& name, const QString& caption, const std::function<void()>& click);
};

/// Sets the function that returns the text of the box "About KEST2".
void setAbout(std::function<QString()> text);
/// Shows the box "About KEST2".
void showAbout();

/// Creates a button with an exit picture and the shortcut Alt+X. `tip` is its tool tip and its accessible name.
QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip = QStringLiteral("Close"));

/// Returns the arrow of a combo box, as the style draws it.
QIcon dropArrow();

}  // namespace kest::desktop

// What a person does with mouse and keyboard: events that enter at the window, as from the system itself.
#pragma once

#include <QKeyCombination>
#include <QPoint>
#include <QString>

class QWidget;

namespace kest::desktop::gestures {

/// Makes the window the active one and lets everything happen that is due.
void activate(QWidget& window);
void settle();

// Each throws a Refusal that says why a person could not do it.

/// Clicks a point of the control.
void click(QWidget& control, QPoint at);
void doubleClick(QWidget& control, QPoint at);
/// Gives the control the focus.
void focus(QWidget& control);
/// Presses and releases one key in the window; what has the focus gets it.
void press(QWidget& window, QKeyCombination key);
/// Types a text, character by character.
void type(QWidget& window, const QString& text);

/// Fails for a control that is hidden or disabled.
void checkUsable(const QWidget& control);

}  // namespace kest::desktop::gestures

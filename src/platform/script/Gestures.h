// Simulates a person's mouse and keyboard with events that enter at the window, as those of the system do.
#pragma once

#include <QKeyCombination>
#include <QPoint>
#include <QString>

class QWidget;

namespace kest::desktop::gestures {

/// Makes the window the active one and processes all pending events.
void activate(QWidget& window);
/// Processes all pending events.
void settle();

// Each function throws a Refusal if a person could not do this.

/// Clicks a point of the control, in its own coordinates.
void click(QWidget& control, QPoint at);
void doubleClick(QWidget& control, QPoint at);
/// Gives the control the focus.
void focus(QWidget& control);
/// Presses and releases a key. The control that has the focus in the window receives it.
void press(QWidget& window, QKeyCombination key);
/// Types a text, character by character.
void type(QWidget& window, const QString& text);

/// Throws a Refusal if the control is hidden or disabled.
void checkUsable(const QWidget& control);

}  // namespace kest::desktop::gestures

// Colours of windows that stay visible on every desktop, dark ones and those with high contrast included.
#pragma once

#include <QColor>

class QAbstractScrollArea;
class QDialog;
class QPalette;

namespace kest::desktop {

/// Returns how well two colours can be told apart, from 1 to 21. A text needs 4.5.
double contrast(const QColor& one, const QColor& other);

/// Returns the colour of links if it can be read in a text field, and otherwise the colour of texts.
QColor markColour(const QPalette& palette);

/// Draws a frame around a list, a text or a page, which has another colour while it has the keyboard focus.
void showFocus(QAbstractScrollArea& area);
/// Draws a line inside of the button of the window that has the keyboard focus: styles draw a default button as if it
/// had the focus.
void showFocusOfButtons(QDialog& window);

}  // namespace kest::desktop

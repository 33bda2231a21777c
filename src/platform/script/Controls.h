// Finds a window's controls by name and operates them as a person would.
#pragma once

#include <QJsonValue>
#include <QString>

class QDialog;
class QWidget;

namespace kest::desktop::controls {

// Each function throws a Refusal if a person could not do this.

/// Returns the control with that objectName. If several have it, returns the visible one. The window's own name returns
/// the window.
QWidget& find(QDialog& window, const QString& name);

/// Clicks the control at the point where a person would.
void click(QWidget& control);
/// Double-clicks the selected row of a list, or the control.
void doubleClick(QWidget& control);
/// Clears a field and types the text; in a combo box, chooses the item with that text.
void set(QWidget& control, const QString& text);
/// Clicks a row. `item` is the text of its first cell, or its number, counted from 0.
void select(QWidget& control, const QJsonValue& item);
/// Clicks the tab with that key or caption.
void chooseTab(QWidget& control, const QString& key);

}  // namespace kest::desktop::controls

// The controls of a window as a script knows them: found by name, worked like a person works them, read.
#pragma once

#include <QJsonObject>
#include <QJsonValue>
#include <QString>
#include <QStringList>

class QDialog;
class QWidget;

namespace kest::desktop::controls {

// Each throws a Refusal that says why it could not be done.

/// The control of that objectName, the visible one where several have it; the window itself by its own name.
QWidget& find(QDialog& window, const QString& name);

/// A click where a person would hit the control.
void click(QWidget& control);
/// A double click on the chosen row of a list, or on the control.
void doubleClick(QWidget& control);
/// Empties a field and types the text; a list of choices takes the item of that text.
void set(QWidget& control, const QString& text);
/// A click on the row with that first text, or that number from 0.
void select(QWidget& control, const QJsonValue& item);
/// A click on the tab with that key or that caption.
void chooseTab(QWidget& control, const QString& key);

/// Of each named control its text, enabled, visible, checked and rows, as far as it has them; without names of all.
QJsonObject read(QDialog& window, const QStringList& names);

}  // namespace kest::desktop::controls

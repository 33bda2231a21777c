// The behaviour that all lists of the windows share.
#pragma once

#include <QList>
#include <QString>
#include <Qt>

class QPushButton;
class QTreeView;

namespace kest::desktop {

/// Sets up a list of whole rows. `window` is the objectName of the list's window.
///
/// A click on a header, or Ctrl and the number of the column, sorts the list; a second one reverses the order. The
/// selected row stays selected and visible. Ctrl and "+" fits all columns to their contents. The last column takes the
/// space that is left. Ctrl+C copies the selected rows, with tabs between their cells.
///
/// If the window has more than one list, the keys of each must be `Qt::WidgetShortcut`, for the list with the focus.
void prepareList(QTreeView& list, const QString& window, Qt::ShortcutContext keysOf = Qt::WindowShortcut);

/// Returns the tool tip of a column's header, counted from 0. prepareList() sets it, but only in a model that stores
/// it.
QString sortTip(int column);

/// Adds a context menu with the visible ones of these buttons, which need a selected row, and with
/// "Copy".
void addListMenu(QTreeView& list, const QString& window, const QList<QPushButton*>& buttons);

}  // namespace kest::desktop

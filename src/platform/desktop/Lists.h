// The behaviour that all lists of the windows share.
#pragma once

#include <QList>

class QPushButton;
class QString;
class QTreeView;

namespace kest::desktop {

/// Sets up a list of whole rows. `window` is the objectName of the list's window.
///
/// A click on a header, or Ctrl and the number of the column, sorts the list; a second one reverses the order. The
/// selected row stays selected and visible. Ctrl and "+" fits all columns to their contents. The last column takes the
/// space that is left. Ctrl+C copies the selected rows, with tabs between their cells.
void prepareList(QTreeView& list, const QString& window);

/// Adds a context menu with the visible ones of these buttons, and with "Copy".
void addListMenu(QTreeView& list, const QString& window, const QList<QPushButton*>& buttons);

}  // namespace kest::desktop

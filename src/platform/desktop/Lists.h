// The behaviour that all lists of the windows share.
#pragma once

class QString;
class QTreeView;

namespace kest::desktop {

/// Sets up a list of whole rows. `window` is the objectName of the list's window.
///
/// A click on a header, or Ctrl and the number of the column, sorts the list; a second one reverses the order. The
/// selected row stays selected and visible. Ctrl and "+" fits all columns to their contents.
void prepareList(QTreeView& list, const QString& window);

}  // namespace kest::desktop

// What all lists of the windows offer to mouse and keyboard alike.
#pragma once

class QString;
class QTreeView;

namespace kest::desktop {

/// Makes a list one of whole rows that is sorted by a click on a header, or Ctrl and the column's number; once more
/// turns the order round. Until then it has the order of its rows. The chosen row stays chosen and in sight.
/// Ctrl and "+" makes every column as wide as what it shows. `window` is the name of the
/// list's window.
void prepareList(QTreeView& list, const QString& window);

}  // namespace kest::desktop

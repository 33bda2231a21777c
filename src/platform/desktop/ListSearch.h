// Search as you type: passes keys between a list and the field that filters it.
#pragma once

#include <QObject>

class QAbstractItemView;
class QKeyEvent;
class QLineEdit;

namespace kest::desktop {

/// Text typed in the list goes into the field. In the field, the arrow and page keys move through the list and Enter
/// gives the list the focus. Escape in either clears the field; if the field is empty, Escape works as usual.
class ListSearch final : public QObject {
    Q_OBJECT
public:
    /// The list becomes the parent. The field must live as long as the list.
    ListSearch(QAbstractItemView& searchedList, QLineEdit& searchField);

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    bool keyInList(QKeyEvent& key);
    bool keyInField(QKeyEvent& key);

    QAbstractItemView& list;
    QLineEdit& field;
};

}  // namespace kest::desktop

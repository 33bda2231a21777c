// Search as you type: the keys that go to and fro between a list and the field that narrows it.
#pragma once

#include <QObject>

class QAbstractItemView;
class QLineEdit;

namespace kest {

/// What is typed in the list goes into the field. In the field the arrow and page keys move through the list, and Enter
/// leaves for it. Escape in either empties the field, and only then goes its usual way.
class ListSearch final : public QObject {
    Q_OBJECT
public:
    /// Lives as long as the list.
    ListSearch(QAbstractItemView& searchedList, QLineEdit& searchField);

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    bool keyInList(QKeyEvent& key);
    bool keyInField(QKeyEvent& key);

    QAbstractItemView& list;
    QLineEdit& field;
};

}  // namespace kest

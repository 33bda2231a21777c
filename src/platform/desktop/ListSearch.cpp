#include "platform/desktop/ListSearch.h"

#include <QAbstractItemView>
#include <QCoreApplication>
#include <QKeyEvent>
#include <QLineEdit>

namespace kest::desktop {

ListSearch::ListSearch(QAbstractItemView& searchedList, QLineEdit& searchField)
    : QObject(&searchedList), list(searchedList), field(searchField)
{
    list.installEventFilter(this);
    field.installEventFilter(this);
}

bool ListSearch::eventFilter(QObject* watched, QEvent* event)
{
    if (event->type() != QEvent::KeyPress)
        return false;
    auto& key = static_cast<QKeyEvent&>(*event);
    if (key.key() == Qt::Key_Escape && !field.text().isEmpty()) {
        field.clear();
        list.setFocus();
        return true;
    }
    return watched == &list ? keyInList(key) : keyInField(key);
}

bool ListSearch::keyInList(QKeyEvent& key)
{
    const bool isText = !key.text().isEmpty() && key.text().front().isPrint() && key.text() != u" " &&
                        !(key.modifiers() & (Qt::ControlModifier | Qt::AltModifier | Qt::MetaModifier));
    const bool isCorrection = key.key() == Qt::Key_Backspace && !field.text().isEmpty();
    if (!isText && !isCorrection)
        return false;
    field.setFocus();
    field.end(false);
    QCoreApplication::sendEvent(&field, &key);
    return true;
}

bool ListSearch::keyInField(QKeyEvent& key)
{
    switch (key.key()) {
        case Qt::Key_Up:
        case Qt::Key_Down:
        case Qt::Key_PageUp:
        case Qt::Key_PageDown:
            QCoreApplication::sendEvent(&list, &key);
            return true;
        case Qt::Key_Return:
        case Qt::Key_Enter:
            list.setFocus();
            return true;
        default:
            return false;
    }
}

}  // namespace kest::desktop

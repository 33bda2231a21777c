#include "platform/desktop/InputBlock.h"

#include <QApplication>
#include <QKeyEvent>

namespace kest::desktop {

namespace {

bool isInput(const QEvent& event)
{
    switch (event.type()) {
        case QEvent::KeyPress:
        case QEvent::KeyRelease:
        case QEvent::ShortcutOverride:
        case QEvent::Shortcut:
        case QEvent::InputMethod:
        case QEvent::MouseButtonPress:
        case QEvent::MouseButtonRelease:
        case QEvent::MouseButtonDblClick:
        case QEvent::Wheel:
        case QEvent::ContextMenu:
        case QEvent::TouchBegin:
        case QEvent::TouchUpdate:
        case QEvent::TouchEnd:
        case QEvent::TabletPress:
        case QEvent::TabletRelease:
        case QEvent::DragEnter:
        case QEvent::DragMove:
        case QEvent::Drop:
            return true;
        case QEvent::Close:
            return event.spontaneous();
        default:
            return false;
    }
}

QList<InputBlock*> blocks;

}  // namespace

InputBlock::InputBlock() : modal(QApplication::activeModalWidget())
{
    blocks.append(this);
    qApp->installEventFilter(this);
}

InputBlock::~InputBlock()
{
    blocks.removeOne(this);
}

bool InputBlock::eventFilter(QObject* watched, QEvent* event)
{
    if (!isInput(*event) || QApplication::activeModalWidget() != modal)
        return QObject::eventFilter(watched, event);
    if (event->type() == QEvent::KeyPress && static_cast<QKeyEvent*>(event)->key() == Qt::Key_Escape)
        for (InputBlock* block : std::as_const(blocks))
            block->escaped = true;
    // an accepted ShortcutOverride keeps the key from being a shortcut; an ignored Close keeps the window open
    event->setAccepted(event->type() == QEvent::ShortcutOverride);
    return true;
}

}  // namespace kest::desktop

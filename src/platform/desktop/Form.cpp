#include "platform/desktop/Form.h"

#include "platform/Prompt.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QKeyEvent>
#include <QLayout>
#include <QPainter>
#include <QPushButton>
#include <QStyleOption>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

std::function<QString()> aboutText;

constexpr int pictureSize = 24;  // pixels

/// Draws lines in the colour of the text, so that they are visible on light and dark desktops.
QIcon drawn(const QPalette& palette, const QList<QPolygonF>& lines)
{
    constexpr qreal sharpness = 2;
    QPixmap picture(QSize(pictureSize, pictureSize) * sharpness);
    picture.setDevicePixelRatio(sharpness);
    picture.fill(Qt::transparent);
    QPainter painter(&picture);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(QPen(palette.color(QPalette::ButtonText), 2, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
    for (const QPolygonF& line : lines)
        painter.drawPolyline(line);
    return picture;
}

/// Draws a door with an arrow that leads out.
QIcon exitPicture(const QPalette& palette)
{
    return drawn(palette, {QPolygonF({{13, 7}, {13, 3}, {3, 3}, {3, 21}, {13, 21}, {13, 17}}),
                           QPolygonF(QList<QPointF>{{8, 12}, {21, 12}}), QPolygonF({{17, 8}, {21, 12}, {17, 16}})});
}

bool isPlainEnter(const QKeyEvent& key)
{
    return (key.key() == Qt::Key_Return || key.key() == Qt::Key_Enter) && !(key.modifiers() & ~Qt::KeypadModifier);
}

}  // namespace

Form::Form(const QString& name, const QString& caption) : QDialog(nullptr)
{
    setObjectName(name);
    setWindowTitle(caption);
    showFocusOfButtons(*this);
}

void Form::showEvent(QShowEvent* event)
{
    for (QPushButton* button : findChildren<QPushButton*>())
        button->setAutoDefault(false);
    setAttribute(Qt::WA_KeyboardFocusChange);  // otherwise the focus is invisible until the first Tab
    QDialog::showEvent(event);
}

QPushButton* Form::button(const QString& name, const QString& caption, const std::function<void()>& click)
{
    auto* made = new QPushButton(caption);
    made->setObjectName(name);
    on(made, &QPushButton::clicked, name + u"_Click"_s, click);
    return made;
}

void Form::fixSize()
{
    layout()->setSizeConstraint(QLayout::SetFixedSize);
}

void Form::keyPressEvent(QKeyEvent* event)
{
    auto* button = qobject_cast<QAbstractButton*>(focusWidget());
    if (event->matches(QKeySequence::Cancel))
        close();
    else if (event->key() == Qt::Key_Tab && event->modifiers() == Qt::ControlModifier)
        focusNextChild();  // leaves a text editor, in which Tab is a character
    else if (event->key() == Qt::Key_F1)
        guarded(objectName() + u".Form_KeyHelp"_s, showAbout);
    else if (isPlainEnter(*event) && button && button->isEnabled() && !button->isCheckable())
        button->click();
    else
        QDialog::keyPressEvent(event);
}

void setAbout(std::function<QString()> text)
{
    aboutText = std::move(text);
}

void showAbout()
{
    msgBox(aboutText ? aboutText() : u"KEST2 " KEST_VERSION ""_s, Icon::Information, u"About KEST2"_s);
}

QIcon dropArrow(const QPalette& palette)
{
    constexpr qreal sharpness = 2;
    const int size = QApplication::style()->pixelMetric(QStyle::PM_SmallIconSize);  // as in a QLineEdit, so not shrunk
    QPixmap picture(QSize(size, size) * sharpness);
    picture.setDevicePixelRatio(sharpness);
    picture.fill(Qt::transparent);
    QPainter painter(&picture);
    QStyleOption arrow;
    arrow.rect = QRect(0, 0, size, size);
    arrow.palette = palette;
    arrow.state = QStyle::State_Enabled;
    QApplication::style()->drawPrimitive(QStyle::PE_IndicatorArrowDown, &arrow, &painter);
    return picture;
}

QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip)
{
    auto* button = new QPushButton(parent);
    button->setObjectName(name);
    button->setIcon(exitPicture(button->palette()));
    button->setIconSize({pictureSize, pictureSize});
    button->setToolTip(tip);
    button->setAccessibleName(tip);
    button->setShortcut(QKeySequence(Qt::ALT | Qt::Key_X));
    button->setAutoDefault(false);
    return button;
}

}  // namespace kest::desktop

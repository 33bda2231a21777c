#include "platform/desktop/Form.h"

#include "platform/Prompt.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QIconEngine>
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

/// A picture that is drawn in the colours that the desktop has now.
class DrawnIcon final : public QIconEngine {
public:
    using Drawing = void (*)(QPainter& painter);

    /// The drawing is that of a square of this size in pixels.
    DrawnIcon(Drawing picture, int pixels) : drawing(picture), side(pixels) {}

    void paint(QPainter* painter, const QRect& place, QIcon::Mode, QIcon::State) override
    {
        painter->save();
        painter->translate(place.topLeft());
        painter->scale(place.width() / qreal(side), place.height() / qreal(side));
        drawing(*painter);
        painter->restore();
    }
    QPixmap pixmap(const QSize& size, QIcon::Mode mode, QIcon::State state) override
    {
        QPixmap picture(size);
        picture.fill(Qt::transparent);
        QPainter painter(&picture);
        paint(&painter, picture.rect(), mode, state);
        return picture;
    }
    QIconEngine* clone() const override { return new DrawnIcon(drawing, side); }

private:
    Drawing drawing;
    int side;
};

/// Draws a door with an arrow that leads out.
void drawExit(QPainter& painter)
{
    painter.setRenderHint(QPainter::Antialiasing);
    const QColor colour = QApplication::palette().color(QPalette::ButtonText);
    painter.setPen(QPen(colour, 2, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
    painter.drawPolyline(QPolygonF({{13, 7}, {13, 3}, {3, 3}, {3, 21}, {13, 21}, {13, 17}}));
    painter.drawLine(8, 12, 21, 12);
    painter.drawPolyline(QPolygonF({{17, 8}, {21, 12}, {17, 16}}));
}

/// As in a QLineEdit, so that it is not shrunk there.
int arrowSize()
{
    return QApplication::style()->pixelMetric(QStyle::PM_SmallIconSize);
}

void drawArrow(QPainter& painter)
{
    QStyleOption arrow;
    arrow.rect = QRect(0, 0, arrowSize(), arrowSize());
    arrow.palette = QApplication::palette();
    arrow.state = QStyle::State_Enabled;
    QApplication::style()->drawPrimitive(QStyle::PE_IndicatorArrowDown, &arrow, &painter);
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

void Form::changeEvent(QEvent* event)
{
    QDialog::changeEvent(event);
    if (event->type() == QEvent::PaletteChange)
        chooseColours();
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

QIcon dropArrow()
{
    return QIcon(new DrawnIcon(drawArrow, arrowSize()));
}

QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip)
{
    auto* button = new QPushButton(parent);
    button->setObjectName(name);
    button->setIcon(QIcon(new DrawnIcon(drawExit, pictureSize)));
    button->setIconSize({pictureSize, pictureSize});
    button->setToolTip(tip);
    button->setAccessibleName(tip);
    button->setShortcut(QKeySequence(Qt::ALT | Qt::Key_X));
    button->setAutoDefault(false);
    return button;
}

}  // namespace kest::desktop

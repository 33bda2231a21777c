#include "platform/desktop/Colours.h"

#include <QAbstractScrollArea>
#include <QApplication>
#include <QDialog>
#include <QEvent>
#include <QPainter>
#include <QPalette>
#include <QPointer>
#include <QPushButton>

#include <algorithm>
#include <cmath>

namespace kest::desktop {

namespace {

constexpr double readable = 4.5;
constexpr int frameWidth = 2;  // pixels

/// Returns the luminance that a person perceives, from 0 to 1.
double luminance(const QColor& colour)
{
    const auto linear = [](double part) {
        return part <= 0.03928 ? part / 12.92 : std::pow((part + 0.055) / 1.055, 2.4);
    };
    return 0.2126 * linear(colour.redF()) + 0.7152 * linear(colour.greenF()) + 0.0722 * linear(colour.blueF());
}

class FocusFrame final : public QObject {
public:
    explicit FocusFrame(QAbstractScrollArea& framed) : QObject(&framed), area(framed)
    {
        area.setFrameStyle(QFrame::Box | QFrame::Plain);
        area.setLineWidth(frameWidth);
        area.setForegroundRole(QPalette::WindowText);  // in which the frame is drawn; QGraphicsView has another one
        area.installEventFilter(this);
        colour(area.hasFocus());
    }

protected:
    bool eventFilter(QObject* watched, QEvent* event) override
    {
        if (event->type() == QEvent::FocusIn || event->type() == QEvent::FocusOut)
            colour(event->type() == QEvent::FocusIn);
        else if (event->type() == QEvent::ApplicationPaletteChange)
            colour(area.hasFocus());
        return QObject::eventFilter(watched, event);
    }

private:
    void colour(bool hasFocus)
    {
        QPalette colours = area.palette();
        const QPalette usual = QApplication::palette(&area);
        colours.setColor(QPalette::WindowText, usual.color(hasFocus ? QPalette::Highlight : QPalette::Mid));
        area.setPalette(colours);
    }

    QAbstractScrollArea& area;
};

/// Lies over the button that has the focus.
class FocusMark final : public QWidget {
public:
    explicit FocusMark(QDialog& window) : QWidget(&window)
    {
        setAttribute(Qt::WA_TransparentForMouseEvents);
        hide();
        connect(qApp, &QApplication::focusChanged, this, [this](QWidget*, QWidget* now) { follow(now); });
    }

protected:
    bool eventFilter(QObject* watched, QEvent* event) override
    {
        if (watched == button && (event->type() == QEvent::Resize || event->type() == QEvent::Move))
            lieOver();
        return QWidget::eventFilter(watched, event);
    }
    void paintEvent(QPaintEvent*) override
    {
        QPainter painter(this);
        painter.setPen(QPen(palette().color(QPalette::ButtonText), 1, Qt::DotLine));
        painter.drawRect(rect().adjusted(inset, inset, -inset - 1, -inset - 1));
    }

private:
    static constexpr int inset = 3;  // pixels

    void follow(QWidget* focused)
    {
        if (button)
            button->removeEventFilter(this);
        button = focused && focused->window() == window() ? qobject_cast<QPushButton*>(focused) : nullptr;
        setVisible(button);
        if (!button)
            return;
        button->installEventFilter(this);
        lieOver();
    }
    void lieOver()
    {
        setGeometry(QRect(button->mapTo(window(), QPoint()), button->size()));
        raise();
    }

    QPointer<QWidget> button;  // not of QPushButton, which it no longer is while its destructor runs
};

}  // namespace

double contrast(const QColor& one, const QColor& other)
{
    const auto [dark, light] = std::minmax({luminance(one), luminance(other)});
    return (light + 0.05) / (dark + 0.05);
}

QColor markColour(const QPalette& palette)
{
    const QColor link = palette.color(QPalette::Link);
    return contrast(link, palette.color(QPalette::Base)) < readable ? palette.color(QPalette::Text) : link;
}

void showFocus(QAbstractScrollArea& area)
{
    new FocusFrame(area);
}

void showFocusOfButtons(QDialog& window)
{
    new FocusMark(window);
}

}  // namespace kest::desktop

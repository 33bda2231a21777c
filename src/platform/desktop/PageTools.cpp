#include "platform/desktop/PageTools.h"

#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"

#include <QAbstractScrollArea>
#include <QHBoxLayout>
#include <QScrollBar>
#include <QShortcut>
#include <QToolButton>

namespace kest::desktop {

using namespace Qt::StringLiterals;

PageTools::PageTools(QWidget* parent, const QString& window, const PageActions& actions)
    : QWidget(parent), source(window), lblPage(new StatusLine(u"lblPage"_s))
{
    auto* row = new QHBoxLayout(this);
    row->setContentsMargins({});
    row->setSpacing(0);  // so that all tools fit side by side on a small screen
    const auto goTo = [go = actions.goTo, this](int page) { go(qBound(1, page, qMax(1, count))); };
    add("cmdPrint", "Print...", "Print", {QKeySequence::Print}, actions.print);
    add("cmdSave", "Save PDF...", "Save as a PDF file", {QKeySequence::Save}, actions.save);
    back = {
        add("cmdFirst", "First", "First page", {Qt::Key_Home, Qt::CTRL | Qt::Key_Home}, [=] { goTo(1); }),
        add("cmdPrevious", "Previous", "Previous page", {Qt::CTRL | Qt::Key_PageUp}, [=, this] { goTo(current - 1); })};
    forward = {add("cmdNext", "Next", "Next page", {Qt::CTRL | Qt::Key_PageDown}, [=, this] { goTo(current + 1); }),
               add("cmdLast", "Last", "Last page", {Qt::Key_End, Qt::CTRL | Qt::Key_End}, [=, this] { goTo(count); })};
    add("cmdZoomIn", "Zoom in", "Larger", {QKeySequence::ZoomIn, Qt::CTRL | Qt::Key_Equal}, actions.enlarge);
    add("cmdZoomOut", "Zoom out", "Smaller", {QKeySequence::ZoomOut}, actions.reduce);
    add("cmdFitWidth", "Fit width", "As wide as the window", {Qt::CTRL | Qt::Key_0}, actions.fitWidth);
    add("cmdFitPage", "Fit page", "The whole page", {Qt::CTRL | Qt::Key_1}, actions.fitPage);

    for (const auto& [key, direction] : {std::pair(Qt::Key_PageUp, -1), {Qt::Key_PageDown, 1}})
        onEvent(new QShortcut(key, this), &QShortcut::activated, this, source + u".View_Scroll"_s,
                [=, this, direction = direction] { scroll(actions, direction); });
    lblPage->setContentsMargins({pixels(90), 0, pixels(90), 0});
    lblPage->setMinimumWidth(lblPage->fontMetrics().horizontalAdvance(u"Page 88 of 88"_s) + pixels(180));
    row->addWidget(lblPage);
    row->addStretch();
}

QToolButton* PageTools::add(const char* name, const char* caption, const char* hint, const QList<QKeySequence>& keys,
                            const std::function<void()>& action)
{
    if (!action)
        return nullptr;
    auto* tool = new QToolButton;
    tool->setObjectName(QString::fromLatin1(name));
    tool->setText(QString::fromLatin1(caption));
    tool->setAutoRaise(true);
    tool->setToolTip(u"%1 (%2)"_s.arg(QString::fromLatin1(hint), keys.first().toString(QKeySequence::NativeText)));
    layout()->addWidget(tool);
    const QString event = u"%1.%2_Click"_s.arg(source, tool->objectName());
    auto* shortcut = new QShortcut(this);
    shortcut->setKeys(keys);
    onEvent(tool, &QToolButton::clicked, this, event, action);
    onEvent(shortcut, &QShortcut::activated, this, event, action);
    return tool;
}

// At the end of the view, goes on to the next page if the view shows only one.
void PageTools::scroll(const PageActions& actions, int direction)
{
    QScrollBar& bar = *actions.view->verticalScrollBar();
    const int end = direction > 0 ? bar.maximum() : bar.minimum();
    const int next = current + direction;
    if (bar.value() != end) {
        bar.triggerAction(direction > 0 ? QAbstractSlider::SliderPageStepAdd : QAbstractSlider::SliderPageStepSub);
    } else if (actions.showsOnePage && next >= 1 && next <= count) {
        actions.goTo(next);
        bar.setValue(direction > 0 ? bar.minimum() : bar.maximum());
    }
}

void PageTools::showPage(int page, int pages)
{
    current = page;
    count = pages;
    lblPage->tell(u"Page %1 of %2"_s.arg(page).arg(pages));
    for (QToolButton* button : std::as_const(back))
        button->setEnabled(page > 1);
    for (QToolButton* button : std::as_const(forward))
        button->setEnabled(page < pages);
}

}  // namespace kest::desktop

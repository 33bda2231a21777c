#include "platform/desktop/StatusLine.h"

#include <QAccessibleWidget>

namespace kest::desktop {

namespace {

class AccessibleStatusLine final : public QAccessibleWidget {
public:
    explicit AccessibleStatusLine(StatusLine* line) : QAccessibleWidget(line, QAccessible::StatusBar) {}

    QString text(QAccessible::Text kind) const override
    {
        return kind == QAccessible::Name ? static_cast<StatusLine*>(widget())->spoken() : QAccessibleWidget::text(kind);
    }
};

QAccessibleInterface* accessible(const QString& /*className*/, QObject* object)
{
    auto* line = qobject_cast<StatusLine*>(object);
    return line ? new AccessibleStatusLine(line) : nullptr;
}

}  // namespace

StatusLine::StatusLine(const QString& name)
{
    QAccessible::installFactory(accessible);
    setObjectName(name);
    setTextFormat(Qt::PlainText);
}

void StatusLine::tell(const QString& text, const QString& beside)
{
    if (text == this->text() && beside == besideIt)
        return;
    setText(text);
    besideIt = beside;
    QAccessibleEvent event(this, QAccessible::Alert);
    QAccessible::updateAccessibility(&event);
    emit told(spoken());
}

}  // namespace kest::desktop

#include "platform/script/ControlReading.h"

#include "platform/script/Controls.h"
#include "platform/script/Refusal.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QAbstractSpinBox>
#include <QComboBox>
#include <QDialog>
#include <QGroupBox>
#include <QJsonArray>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QTabBar>
#include <QTabWidget>
#include <QTextEdit>

#include <optional>

namespace kest::desktop::controls {

using namespace Qt::StringLiterals;

namespace {

/// Returns a caption as the user sees it: "Load" for "&Load", and "A & B" for "A && B".
QString withoutMark(const QString& caption)
{
    QString result;
    for (qsizetype at = 0; at < caption.size(); ++at) {
        if (caption[at] == u'&' && at + 1 < caption.size())
            ++at;
        result.append(caption[at]);
    }
    return result;
}

const QTabBar* tabsOf(const QWidget& control)
{
    if (const auto* tabs = qobject_cast<const QTabWidget*>(&control))
        return tabs->tabBar();
    return qobject_cast<const QTabBar*>(&control);
}

std::optional<QString> textOf(const QWidget& control)
{
    if (control.isWindow())
        return control.windowTitle();
    if (const QVariant exact = control.property("exactText"); exact.isValid())  // with its own line ends
        return exact.toString();
    if (const auto* button = qobject_cast<const QAbstractButton*>(&control))
        return withoutMark(button->text());
    if (const auto* label = qobject_cast<const QLabel*>(&control))
        return label->buddy() ? withoutMark(label->text()) : label->text();
    if (const auto* frame = qobject_cast<const QGroupBox*>(&control))
        return withoutMark(frame->title());
    if (const auto* field = qobject_cast<const QLineEdit*>(&control))
        return field->text();
    if (const auto* text = qobject_cast<const QPlainTextEdit*>(&control))
        return text->toPlainText();
    if (const auto* text = qobject_cast<const QTextEdit*>(&control))
        return text->toPlainText();
    if (const auto* number = qobject_cast<const QAbstractSpinBox*>(&control))
        return number->text();
    if (const auto* combo = qobject_cast<const QComboBox*>(&control))
        return combo->currentText();
    if (const QTabBar* bar = tabsOf(control))
        return withoutMark(bar->tabText(bar->currentIndex()));
    if (const auto* field = qobject_cast<const QLineEdit*>(control.focusProxy()))
        return field->text();  // a composed control that contains a field
    return std::nullopt;
}

std::optional<bool> checkedOf(const QWidget& control)
{
    if (const auto* button = qobject_cast<const QAbstractButton*>(&control); button && button->isCheckable())
        return button->isChecked();
    if (const auto* frame = qobject_cast<const QGroupBox*>(&control); frame && frame->isCheckable())
        return frame->isChecked();
    return std::nullopt;
}

QJsonArray rowsOf(const QAbstractItemModel& model, const QModelIndex& root)
{
    QJsonArray rows;
    for (int row = 0; row < model.rowCount(root); ++row) {
        QJsonArray texts;
        for (int column = 0; column < model.columnCount(root); ++column)
            texts.append(model.index(row, column, root).data().toString());
        rows.append(texts);
    }
    return rows;
}

std::optional<QJsonArray> rowsOf(const QWidget& control)
{
    if (const auto* list = qobject_cast<const QAbstractItemView*>(&control))
        return list->model() ? rowsOf(*list->model(), list->rootIndex()) : QJsonArray();
    if (const auto* combo = qobject_cast<const QComboBox*>(&control))
        return rowsOf(*combo->model(), combo->rootModelIndex());
    const QTabBar* bar = tabsOf(control);
    if (!bar)
        return std::nullopt;
    QJsonArray tabs;  // each a caption and a key
    for (int tab = 0; tab < bar->count(); ++tab)
        tabs.append(QJsonArray{withoutMark(bar->tabText(tab)), bar->tabData(tab).toString()});
    return tabs;
}

QJsonObject reading(const QWidget& control)
{
    QJsonObject result{{u"enabled"_s, control.isEnabled()}, {u"visible"_s, control.isVisible()}};
    if (const std::optional<QString> text = textOf(control))
        result.insert(u"text"_s, *text);
    if (const std::optional<bool> checked = checkedOf(control))
        result.insert(u"checked"_s, *checked);
    if (const std::optional<QJsonArray> rows = rowsOf(control))
        result.insert(u"rows"_s, *rows);
    return result;
}

/// Returns the names of the window's own controls, without those that Qt creates inside them.
QStringList allNames(const QDialog& window)
{
    QStringList names;
    for (const QWidget* control : window.findChildren<QWidget*>()) {
        const QString name = control->objectName();
        const bool builtIn = name.startsWith(u"qt_"_s) || qobject_cast<QTabBar*>(control->parentWidget());
        if (!name.isEmpty() && !builtIn)
            names.append(name);
    }
    return names;
}

}  // namespace

QJsonObject read(QDialog& window, const QStringList& names)
{
    QJsonObject values;
    for (const QString& name : names.isEmpty() ? allNames(window) : names) {
        try {
            values.insert(name, reading(find(window, name)));
        } catch (const Refusal& refusal) {
            throw Refusal(name + u": "_s + refusal.why);
        }
    }
    return values;
}

}  // namespace kest::desktop::controls

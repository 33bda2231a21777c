#include "platform/script/Controls.h"

#include "platform/script/Gestures.h"
#include "platform/script/Refusal.h"

#include <QAbstractItemView>
#include <QCheckBox>
#include <QComboBox>
#include <QDialog>
#include <QLineEdit>
#include <QRadioButton>
#include <QStyleOptionButton>
#include <QTabBar>
#include <QTabWidget>

namespace kest::desktop::controls {

using namespace Qt::StringLiterals;

namespace {

/// Returns the point to click: the middle of the control or, for a check box or radio button, of its indicator, because
/// the empty part of a wide one does not react.
QPoint target(const QWidget& control)
{
    QStyleOptionButton option;
    option.initFrom(&control);
    if (qobject_cast<const QCheckBox*>(&control))
        return control.style()->subElementRect(QStyle::SE_CheckBoxIndicator, &option, &control).center();
    if (qobject_cast<const QRadioButton*>(&control))
        return control.style()->subElementRect(QStyle::SE_RadioButtonIndicator, &option, &control).center();
    return control.rect().center();
}

/// Returns the widget that receives typed text: the control itself or the field inside it.
QWidget& editor(QWidget& control)
{
    const auto isEditor = [](const QWidget* widget) {
        return widget && widget->property("readOnly").isValid() && widget->metaObject()->indexOfMethod("clear()") >= 0;
    };
    if (auto* field = control.findChild<QLineEdit*>())  // in a spin box, an editable combo box or a composed control
        return *field;
    if (isEditor(&control))
        return control;
    throw Refusal(u"the control can't be typed in"_s);
}

QString typedText(const QWidget& field)
{
    const QVariant plain = field.property("plainText");
    return plain.isValid() ? plain.toString() : field.property("text").toString();
}

void chooseItem(QComboBox& combo, int item)
{
    gestures::focus(combo);
    const int start = combo.currentIndex();
    for (int moved = start; moved < item; ++moved)
        gestures::press(*combo.window(), Qt::Key_Down);
    for (int moved = start; moved > item; --moved)
        gestures::press(*combo.window(), Qt::Key_Up);
    if (combo.currentIndex() != item)
        throw Refusal(u"the control did not take the item"_s);
}

int rowOf(const QAbstractItemModel& model, const QModelIndex& root, const QJsonValue& item)
{
    for (int row = 0; row < model.rowCount(root); ++row)
        if (item.isDouble() ? row == item.toInt(-1) : model.index(row, 0, root).data().toString() == item.toString())
            return row;
    throw Refusal(u"the control has no such row"_s);
}

QTabBar& tabBar(QWidget& control)
{
    if (auto* bar = qobject_cast<QTabBar*>(&control))
        return *bar;
    if (auto* tabs = qobject_cast<QTabWidget*>(&control))
        return *tabs->tabBar();
    throw Refusal(u"the control has no tabs"_s);
}

int tabOf(const QTabBar& bar, const QString& key)
{
    for (int tab = 0; tab < bar.count(); ++tab)
        if (bar.tabData(tab).toString() == key)
            return tab;
    for (int tab = 0; tab < bar.count(); ++tab)
        if (bar.tabText(tab) == key)
            return tab;
    throw Refusal(u"the control has no such tab"_s);
}

}  // namespace

QWidget& find(QDialog& window, const QString& name)
{
    if (window.objectName() == name)
        return window;
    const QList<QWidget*> named = window.findChildren<QWidget*>(name);
    if (named.isEmpty())
        throw Refusal(u"there is no such control"_s);
    const auto shown = std::ranges::find_if(named, &QWidget::isVisible);
    return shown == named.end() ? *named.first() : **shown;
}

void click(QWidget& control)
{
    gestures::click(control, target(control));
}

void doubleClick(QWidget& control)
{
    auto* list = qobject_cast<QAbstractItemView*>(&control);
    if (!list)
        return gestures::doubleClick(control, target(control));
    gestures::checkUsable(control);
    if (!list->currentIndex().isValid())
        throw Refusal(u"no row is chosen"_s);
    list->scrollTo(list->currentIndex());
    gestures::doubleClick(*list->viewport(), list->visualRect(list->currentIndex()).center());
}

void set(QWidget& control, const QString& text)
{
    gestures::checkUsable(control);
    if (auto* combo = qobject_cast<QComboBox*>(&control); combo && !combo->isEditable())
        return chooseItem(*combo, rowOf(*combo->model(), combo->rootModelIndex(), text));
    QWidget& field = editor(control);
    if (field.property("readOnly").toBool())
        throw Refusal(u"the control is read-only"_s);
    gestures::focus(field);
    if (!typedText(field).isEmpty()) {
        QMetaObject::invokeMethod(&field, "selectAll");
        gestures::press(*control.window(), Qt::Key_Backspace);
    }
    if (!typedText(field).isEmpty())
        QMetaObject::invokeMethod(&field, "clear");
    gestures::type(*control.window(), text);
}

void select(QWidget& control, const QJsonValue& item)
{
    gestures::checkUsable(control);
    if (auto* combo = qobject_cast<QComboBox*>(&control))
        return chooseItem(*combo, rowOf(*combo->model(), combo->rootModelIndex(), item));
    auto* list = qobject_cast<QAbstractItemView*>(&control);
    if (!list)
        throw Refusal(u"the control has no rows"_s);
    const QModelIndex index =
        list->model()->index(rowOf(*list->model(), list->rootIndex(), item), 0, list->rootIndex());
    list->scrollTo(index);
    const QRect row = list->visualRect(index) & list->viewport()->rect();
    if (row.isEmpty())
        throw Refusal(u"the row can't be seen"_s);
    gestures::click(*list->viewport(), row.center());
}

void chooseTab(QWidget& control, const QString& key)
{
    QTabBar& bar = tabBar(control);
    const int tab = tabOf(bar, key);
    if (bar.rect().contains(bar.tabRect(tab).center()))
        return gestures::click(bar, bar.tabRect(tab).center());
    gestures::focus(bar);  // the arrow keys reach a tab that is scrolled out of view
    const int start = bar.currentIndex();
    for (int moved = start; moved < tab; ++moved)
        gestures::press(*bar.window(), Qt::Key_Right);
    for (int moved = start; moved > tab; --moved)
        gestures::press(*bar.window(), Qt::Key_Left);
    if (bar.currentIndex() != tab)
        throw Refusal(u"the tab can't be reached"_s);
}

}  // namespace kest::desktop::controls

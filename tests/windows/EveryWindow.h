// Opens every window of the component in a shop with data for each of them.
#pragma once

#include "support/Shop.h"

namespace kest::test {

class EveryWindow : public Shop {
protected:
    using Check = std::function<void(QDialog& window)>;

    EveryWindow();

    /// Opens each window, calls `check` while it is shown, and closes it. The message list is opened with the unread
    /// and with the read folder. A failed expectation names the window.
    void each(const Check& check);

private:
    static void showBox(const std::function<void()>& show, const Check& check);
};

template <class... Kinds>
bool isA(const QWidget& widget)
{
    return (qobject_cast<const Kinds*>(&widget) || ...);
}

/// Returns the visible widgets of a kind in the window.
template <class Kind>
QList<Kind*> visible(const QDialog& window)
{
    QList<Kind*> all = window.findChildren<Kind*>();
    all.removeIf([](const QWidget* widget) { return !widget->isVisible(); });
    return all;
}

/// Returns the visible and enabled controls that a person can use, without the parts that Qt creates inside of them.
QList<QWidget*> controlsOf(const QDialog& window);
/// Returns the name of a control for error messages.
std::string nameOf(const QWidget& control);

}  // namespace kest::test

// Every window of the component, opened on a shop that has something to show in each.
#pragma once

#include "support/Shop.h"

#include <QDialog>

#include <functional>

namespace kest::test {

class EveryWindow : public Shop {
protected:
    using Check = std::function<void(QDialog& window)>;

    EveryWindow();

    /// Opens each window, the message list once with the unread and once with the read folder, hands it over while it
    /// is shown, and closes it. A failed expectation says which window it was.
    void each(const Check& check);

private:
    static void showBox(const std::function<void()>& show, const Check& check);
};

template <class... Kinds>
bool isA(const QWidget& widget)
{
    return (qobject_cast<const Kinds*>(&widget) || ...);
}

/// The controls that a person works, as far as they are shown and enabled: without the parts that the toolkit builds
/// into them, which go by their owner's keys and name.
QList<QWidget*> controlsOf(const QDialog& window);
/// The name of a control for a failure's text.
std::string nameOf(const QWidget& control);

}  // namespace kest::test

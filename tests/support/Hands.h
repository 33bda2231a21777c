// Operates windows from code, for actions that a script does not have.
#pragma once

#include "platform/desktop/Window.h"

#include <QApplication>
#include <QPageRanges>
#include <QPrintDialog>
#include <QPrinter>
#include <QTimer>
#include <QToolButton>

#include <map>

namespace kest::test {

/// Runs a function for each window that is shown, chosen by the window's name, and then closes the window. The name "*"
/// stands for all others.
class Hands {
public:
    using Work = std::function<void(QDialog&)>;
    explicit Hands(std::map<QString, Work> work)
    {
        struct Driver final : desktop::WindowDriver {
            bool drive(QDialog& window) override
            {
                window.show();
                window.activateWindow();
                QCoreApplication::processEvents();
                const auto found = works.find(window.objectName());
                (found == works.end() ? works.at(QStringLiteral("*")) : found->second)(window);
                if (window.isVisible())
                    window.close();
                return true;
            }
            bool isLikeAPerson() const override { return true; }
            std::map<QString, Work> works;
        };
        const auto driver = std::make_shared<Driver>();
        driver->works = std::move(work);
        desktop::setWindowDriver(driver);
    }
    ~Hands() { desktop::setWindowDriver(nullptr); }
    Q_DISABLE_COPY_MOVE(Hands)
};

/// Returns a control of the window by its name.
template <class Control>
Control& control(QDialog& window, const char* name)
{
    return *window.findChild<Control*>(QString::fromLatin1(name));
}

/// Calls `act` with the next modal window of this kind that a person sees.
template <class Window>
void whenShown(const std::function<void(Window&)>& act)
{
    auto* timer = new QTimer(qApp);
    QObject::connect(timer, &QTimer::timeout, timer, [timer, act] {
        if (auto* window = qobject_cast<Window*>(QApplication::activeModalWidget())) {
            timer->deleteLater();
            timer->stop();
            act(*window);
        }
    });
    timer->start(1);
}

/// Clicks "Print" in a window and answers the printer dialog: prints to that file these pages, such as "1,3-4", or all.
inline std::map<QString, Hands::Work> printing(const QString& name, const QString& file, const QString& pages,
                                               int copies = 1, bool isCollated = true)
{
    const auto choose = [=](QDialog& dialog) {
        QPrinter& printer = *static_cast<QPrintDialog&>(dialog).printer();
        printer.setOutputFileName(file);
        printer.setPageRanges(QPageRanges::fromString(pages));
        printer.setCopyCount(copies);
        printer.setCollateCopies(isCollated);
        dialog.hide();
        dialog.setResult(QDialog::Accepted);
    };
    const auto print = [](QDialog& window) { control<QToolButton>(window, "cmdPrint").click(); };
    return {{name, print}, {QStringLiteral("PrintDialog"), choose}};
}

}  // namespace kest::test

// Works windows in code, for what a script can't do between two of its steps.
#pragma once

#include "platform/desktop/Window.h"

#include <QPrintDialog>
#include <QPrinter>
#include <QToolButton>

#include <map>

namespace kest::test {

/// What is done to each window while it is shown, by the window's name; it is closed afterwards.
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
                works.at(window.objectName())(window);
                if (window.isVisible())
                    window.close();
                return true;
            }
            std::map<QString, Work> works;
        };
        const auto driver = std::make_shared<Driver>();
        driver->works = std::move(work);
        desktop::setWindowDriver(driver);
    }
    ~Hands() { desktop::setWindowDriver(nullptr); }
    Q_DISABLE_COPY_MOVE(Hands)
};

/// A control of the window by its name.
template <class Control>
Control& control(QDialog& window, const char* name)
{
    return *window.findChild<Control*>(QString::fromLatin1(name));
}

/// Clicks "Print" in a window and answers the printer's dialog: into that file, all pages or one alone.
inline std::map<QString, Hands::Work> printing(const QString& name, const QString& file, int onlyPage)
{
    const auto choose = [=](QDialog& dialog) {
        QPrinter& printer = *static_cast<QPrintDialog&>(dialog).printer();
        printer.setOutputFileName(file);
        printer.setPrintRange(onlyPage ? QPrinter::PageRange : QPrinter::AllPages);
        printer.setFromTo(onlyPage, onlyPage);
        dialog.hide();
        dialog.setResult(QDialog::Accepted);
    };
    const auto print = [](QDialog& window) { control<QToolButton>(window, "cmdPrint").click(); };
    return {{name, print}, {QStringLiteral("PrintDialog"), choose}};
}

}  // namespace kest::test

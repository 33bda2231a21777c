// The buttons of a window that shows pages.
#pragma once

#include <QKeySequence>
#include <QWidget>

#include <functional>

class QAbstractScrollArea;
class QToolButton;

namespace kest::desktop {

class StatusLine;

/// What the buttons do. A function that is left out has no button.
struct PageActions {
    std::function<void()> print;
    std::function<void()> save;
    std::function<void(int page)> goTo;  // counted from 1
    std::function<void()> enlarge;
    std::function<void()> reduce;
    std::function<void()> fitWidth;
    std::function<void()> fitPage;
    QAbstractScrollArea* view = nullptr;  // scrolled by PgUp and PgDn, wherever the focus is
    bool showsOnePage = false;            // the view does not scroll from page to page
};

/// A row of buttons for printing, saving, pages and zoom, with the number of the page. All windows that show pages have
/// the same buttons in the same order, with the same keys, which work wherever the focus is.
class PageTools final : public QWidget {
    Q_OBJECT
public:
    /// `window` is the objectName of the window, in which failures are reported.
    PageTools(QWidget* parent, const QString& window, const PageActions& actions);

    /// Shows the page, counted from 1. The buttons that lead to no page are disabled.
    void showPage(int page, int pages);

private:
    QToolButton* add(const char* name, const char* caption, const char* hint, const QList<QKeySequence>& keys,
                     const std::function<void()>& action);
    void scroll(const PageActions& actions, int direction);

    QString source;
    QList<QToolButton*> back;
    QList<QToolButton*> forward;
    StatusLine* lblPage;
    int current = 1;
    int count = 1;
};

}  // namespace kest::desktop

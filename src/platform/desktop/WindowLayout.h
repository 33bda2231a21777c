// Remembers the size of a window, and the column widths and sort order of its lists.
#pragma once

#include <QMap>
#include <QSize>
#include <QStringList>

class QDialog;
class QHeaderView;

namespace kest::desktop {

/// The layout that a user has given to a window, stored in the profile's file `windows.ini` under the objectNames of
/// the window and its lists. A size is limited to the screen. Positions are not remembered.
class WindowLayout {
public:
    /// Applies the stored layout to the window.
    explicit WindowLayout(QDialog& window);
    /// Stores what the user has changed since.
    void remember() const;

private:
    struct State {
        QSize size;
        QMap<QString, QStringList> columns;  // the column widths of each list
        QMap<QString, QStringList> sort;     // the column and the order of each sorted list
    };

    void restore();
    State state() const;
    QMap<QString, QHeaderView*> headers() const;

    QDialog& window;
    State before;
};

}  // namespace kest::desktop

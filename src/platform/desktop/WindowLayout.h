// What a user made of a window, kept from one showing to the next: its size, its lists' column widths and sort order.
#pragma once

#include <QMap>
#include <QSize>
#include <QStringList>

class QDialog;
class QHeaderView;

namespace kest::desktop {

/// The file `windows.ini` of the profile holds, under the window's and the list's objectName, what a user changed.
/// A remembered size is cut to the screen; positions are not remembered.
class WindowLayout {
public:
    /// Gives the window its remembered layout.
    explicit WindowLayout(QDialog& window);
    /// Writes what has changed since.
    void remember() const;

private:
    struct State {
        QSize size;
        QMap<QString, QStringList> columns;  // of each list: the widths
        QMap<QString, QStringList> sort;     // of each sorted list: column, order
    };

    void restore();
    State state() const;
    QMap<QString, QHeaderView*> headers() const;

    QDialog& window;
    State before;
};

}  // namespace kest::desktop

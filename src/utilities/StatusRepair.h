// One table of what each button of "Set Quote Status" changes in the window.
#pragma once

#include <QList>
#include <QString>
#include <QStringList>

namespace kest {

/// Sets a quote's read-only tick and its note chain to what they would be if its messages had gone another way.
struct StatusRepair {
    struct Note {
        QString subject;
        QString status;
        bool mainQuoteOnly = false;
    };

    QString button;
    QString caption;
    bool startsGroup = false;         // leave a gap between this button and the one before it
    bool locks = true;                // tick "read only"
    bool forgetsQuoteNumber = false;  // clear the network's quote number
    QStringList removed;              // subjects of notes, in the order in which they are removed
    QList<Note> added;                // in the order in which they are added
};

/// Returns the repairs in the order of their buttons.
const QList<StatusRepair>& statusRepairs();

}  // namespace kest

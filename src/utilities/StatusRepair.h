// What each button of "Set Quote Status" does to the window: one table.
#pragma once

#include <QList>
#include <QString>
#include <QStringList>

namespace kest {

/// Puts a quote's tick and note chain as they would stand had its messages gone another way.
struct StatusRepair {
    struct Note {
        QString subject;
        QString status;
        bool mainQuoteOnly = false;
    };

    QString button;
    QString caption;
    bool startsGroup = false;  // set apart from the buttons before it
    bool locks = true;
    bool forgetsQuoteNumber = false;
    QStringList removed;  // subjects, in order
    QList<Note> added;    // in order
};

/// In the order of the buttons.
const QList<StatusRepair>& statusRepairs();

}  // namespace kest

// What the transport and its insurer remember between two runs, stored in a file.
#pragma once

#include "loopback/InsurerMemory.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest::app {

/// The remaining steps for a quote or request.
struct Dealing {
    Parameters facts;   // the parameters of the rule and of the steps so far
    QStringList steps;  // as the rules had them when the first step began
    QString origin;     // "insurer.rules, line 7", for error messages
    int waited = 0;     // for how many runs the first step has waited
    QString document;   // the document that is being sent; the steps wait for it
    QString message;    // the message in the incoming folder that the shop must deal with first
};

/// The state of a transport.
struct TransportState {
    InsurerMemory insurer;
    QStringList moving;   // files that are being sent together
    QStringList started;  // the texts of the "on start" rules that have begun
    QList<Dealing> dealings;

    /// Reads the content of a state file. Throws TypeMismatch if it is not one.
    static TransportState parsed(const QByteArray& text);
    /// Returns the content of the state file.
    QByteArray text() const;
};

}  // namespace kest::app

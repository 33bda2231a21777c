// What the insurer remembers between two runs of the transport, stored in a file.
#pragma once

#include "loopback/InsurerRules.h"

#include <QList>
#include <QMap>
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
    qint64 numbers = 0;                  // how many numbers were given to quotes, authorities, requests and claims
    qint64 messages = 0;                 // how many messages were sent
    QStringList moving;                  // files that are being sent together
    QStringList started;                 // the texts of the "on start" rules that have begun
    QMap<QString, Parameters> quotes;    // by "1004/0": documents, network, authorised, request, claim
    QMap<QString, Parameters> requests;  // by number: claim, rego, vehicle, version
    QList<Dealing> dealings;

    /// Reads the content of a state file. Throws TypeMismatch if it is not one.
    static TransportState parsed(const QByteArray& text);
    /// Returns the content of the state file.
    QByteArray text() const;
};

}  // namespace kest::app

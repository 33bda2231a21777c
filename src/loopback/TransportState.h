// What the insurer remembers from one carry to the next, in one file.
#pragma once

#include "loopback/InsurerRules.h"

#include <QList>
#include <QMap>
#include <QString>
#include <QStringList>

namespace kest::app {

/// Steps that are still to come about one quote or request.
struct Dealing {
    Parameters facts;   // what the steps go by: those of the rule, and what they have told since
    QStringList steps;  // as they stood in the rules when it began
    QString origin;     // "insurer.rules, line 7", for faults
    int waited = 0;     // carries, for the first step
    QString document;   // whose carrying has begun; nothing happens before it is done
    QString message;    // of the incoming folder, which the shop has to deal with first
};

struct TransportState {
    qint64 numbers = 0;                  // given to quotes, authorities, requests and claims
    qint64 messages = 0;                 // sent
    QStringList moving;                  // files of one carry, until all are carried
    QStringList started;                 // the rules for the start that are done, as texts
    QMap<QString, Parameters> quotes;    // by "1004/0": documents, network, authorised, request, claim
    QMap<QString, Parameters> requests;  // by number: claim, rego, vehicle, version
    QList<Dealing> dealings;

    /// Throws TypeMismatch for a text that is none.
    static TransportState parsed(const QByteArray& text);
    QByteArray text() const;
};

}  // namespace kest::app

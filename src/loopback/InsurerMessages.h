// Writes the texts that the insurer sends: network messages, answers to a sent quote, and markers.
#pragma once

#include "loopback/AssessedBody.h"
#include "loopback/Dice.h"
#include "loopback/InsurerRules.h"
#include "loopback/QuoteDocument.h"

#include <QDate>
#include <QString>

namespace kest::app {

/// What the insurer knows about the quote or request of a message.
struct Matter {
    QuoteKey quote{{}, {}};  // empty if the message is about a request
    QString request;
    QString version;
    QString claim;
    QString rego;
    QString vehicle;
    QString network;     // the network's number of the sent quote
    QString authorised;  // the network's number of the authorised or adjusted quote
    QuoteDocument document;
};

/// Returns the code of a step's message, such as "AUQT" or "MDMSG", or an empty text for an answer to a sent quote.
QString messageCode(Act act);

/// Returns the text of a step's message. Its dates are relative to `today`.
QString messageText(const Step& step, const Matter& matter, Dice& dice, const QDate& today);

}  // namespace kest::app

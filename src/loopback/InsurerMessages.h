// Writes what the insurer sends: network messages, answers to a sent quote, markers.
#pragma once

#include "loopback/AssessedBody.h"
#include "loopback/Dice.h"
#include "loopback/InsurerRules.h"
#include "loopback/QuoteDocument.h"

#include <QDate>
#include <QString>

namespace kest::app {

/// What a message is about, as far as the insurer knows it.
struct Matter {
    QString quote;
    QString subquote;
    QString request;
    QString version;
    QString claim;
    QString rego;
    QString vehicle;
    QString network;     // the network's number of the sent quote
    QString authorised;  // that of the quote once authorised or adjusted
    QuoteDocument document;

    QString reference() const { return subquote == u"0" ? quote : quote + u'/' + subquote; }
};

/// The code of a step's message: "AUQT", "MDMSG"; empty for an answer to a sent quote.
QString messageCode(Act act);

/// The message of a step. Dates count from `today`.
QString messageText(const Step& step, const Matter& matter, Dice& dice, const QDate& today);

}  // namespace kest::app

// What the insurer remembers about quotes and requests, and the facts that it makes up for its messages.
#pragma once

#include "loopback/InsurerMessages.h"

#include <QMap>

#include <functional>
#include <optional>

namespace kest::app {

/// The memory of the insurer. It knows a quote only from its document and from its own messages.
class InsurerMemory {
public:
    /// Returns the newest document of a quote that the shop has sent.
    using Documents = std::function<std::optional<QuoteDocument>(const QuoteKey&)>;

    /// Remembers that a document has arrived. Returns how many have arrived for its quote.
    int documentArrived(const QuoteDocument& quote);
    /// Remembers the claim of a quote.
    void setClaim(const QuoteKey& quote, const QString& claim);
    /// Remembers the network's number of a quote.
    void setNetworkNumber(const QuoteKey& quote, const QString& number);
    bool knowsNetworkNumber(const QuoteKey& quote) const;

    /// Returns the number of the request that a quote answers, or an empty text if it answers none.
    QString requestOf(const QString& quoteNumber, const Documents& documents) const;
    /// Returns what is known about the quote or request of a step. Facts that the step states come first.
    Matter matterOf(const Step& step, const Documents& documents) const;
    /// Fills in the unknown facts of a message. Throws TypeMismatch if one is missing that the insurer can't make up.
    void complete(const Step& step, Matter& matter, quint32 seed);
    /// Remembers the facts of a message that has been sent.
    void remember(const Step& step, const Matter& matter);

    /// Returns the random choices for the content of the next message.
    Dice dice(quint32 seed) const { return {seed, quint32(messages)}; }

    qint64 numbers = 0;                  // how many numbers were given to quotes, authorities, requests and claims
    qint64 messages = 0;                 // how many messages were sent
    QMap<QString, Parameters> quotes;    // by "1004/0": documents, network, request, claim
    QMap<QString, Parameters> requests;  // by number: claim, rego, vehicle, version
};

}  // namespace kest::app

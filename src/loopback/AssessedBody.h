// The lines of a quote as the insurer sends them back: kept, changed, added, deleted, totalled.
#pragma once

#include "loopback/Dice.h"
#include "loopback/QuoteDocument.h"
#include "platform/xml/Branch.h"

namespace kest::app {

struct QuoteBody {
    QString reference;
    QString type;
    QList<BodyLine> lines[SectionCount];

    /// As `quoteTotal` says it, tax included; deleted lines count nothing.
    double total() const;
    void writeTo(const Branch& body) const;
};

/// How many lines the insurer changes; of each as many as there are.
struct Changes {
    int change = 0;
    int add = 0;
    int remove = 0;
    int sublets = 0;  // added, each with the document that authorises it
};

/// The shop's lines, each with its indicator. Added ones have numbers above all of the shop's.
QuoteBody assessedBody(const QuoteDocument& quote, const Changes& changes, Dice& dice);
/// The shop's lines as they are, without indicators.
QuoteBody sameBody(const QuoteDocument& quote);
/// A quote that was written at the insurer's.
QuoteBody manualBody(const QString& reference, const QString& type, const int (&counts)[SectionCount], Dice& dice);

}  // namespace kest::app

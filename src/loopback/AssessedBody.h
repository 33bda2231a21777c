// The lines of a quote as the insurer returns them: some changed, added or deleted, with new totals.
#pragma once

#include "loopback/Dice.h"
#include "loopback/QuoteDocument.h"
#include "platform/xml/Branch.h"

namespace kest::app {

/// The body of a quote document from the insurer.
struct AssessedBody {
    QString reference;
    QString type;
    QList<BodyLine> lines[SectionCount];

    /// The value of `quoteTotal`, including tax and without deleted lines.
    double total() const;
    /// Adds the elements of the quote body to `body`.
    void writeTo(const Branch& body) const;
};

/// How many lines the insurer changes, at most all that there are.
struct Changes {
    int change = 0;
    int add = 0;
    int remove = 0;
    int sublets = 0;  // sublets to add, each with an authority document
};

/// Returns the shop's lines after the changes, each with its indicator. The numbers of added lines are higher than all
/// of the shop's.
AssessedBody assessedBody(const QuoteDocument& quote, const Changes& changes, Dice& dice);
/// Returns the shop's lines unchanged and without indicators.
AssessedBody sameBody(const QuoteDocument& quote);
/// Returns a quote that the insurer wrote. `counts` is the number of lines in each section.
AssessedBody manualBody(const QString& reference, const QString& type, const int (&counts)[SectionCount], Dice& dice);

}  // namespace kest::app

// A quote document as the shop leaves it in the outgoing folder, read as the insurer reads it.
#pragma once

#include "loopback/InsurerRules.h"

#include <QList>
#include <QString>

namespace kest::app {

/// A section of a quote body and what its lines hold.
struct BodySection {
    const char* name;             // "labours"
    const char* line;             // "labour"
    const char* total;            // the body's element behind the section
    QList<const char*> elements;  // of a line, behind indicator and number
};
/// Labours, paints, parts, sublets: the order of a document.
const QList<BodySection>& bodySections();
enum SectionIndex : int { Labours, Paints, Parts, Sublets, SectionCount };

struct BodyLine {
    QString indicator;  // empty, or "N", "C", "I", "D"
    int number = 0;
    Parameters values;
};

struct QuoteDocument {
    QString quote;
    QString subquote;
    QString request;  // empty where the quote answers none
    QString version;
    QString claim;
    QString rego;
    QString vehicle;
    QString type;         // "R" or "S"
    Parameters customer;  // companyName, or title, firstName, surname
    QList<BodyLine> lines[SectionCount];

    QString reference() const { return quote + u'/' + subquote; }
    /// The highest line number, those of report items included.
    int highestLine = 0;
};

/// Throws TypeMismatch, with the reason in words, for a text that is no quote document or that no answer could name.
QuoteDocument quoteDocument(const QString& text);

}  // namespace kest::app

// Reads the quote documents that the shop puts into the outgoing folder.
#pragma once

#include "loopback/InsurerRules.h"

#include <QList>
#include <QString>

namespace kest::app {

/// A section of a quote body and the elements of its lines.
struct BodySection {
    const char* name;             // "labours"
    const char* line;             // "labour"
    const char* total;            // the element of the body that follows the section
    QList<const char*> elements;  // of a line, after its indicator and number
};
/// Returns the sections in the order of a document: labours, paints, parts, sublets.
const QList<BodySection>& bodySections();
enum SectionIndex : int { Labours, Paints, Parts, Sublets, SectionCount };

/// A line of a quote body.
struct BodyLine {
    QString indicator;  // empty, or "N", "C", "I", "D"
    int number = 0;
    Parameters values;
};

/// What the insurer reads from a quote document.
struct QuoteDocument {
    QuoteKey key{{}, {}};
    QString request;  // empty if the quote does not answer a request
    QString version;
    QString claim;
    QString rego;
    QString vehicle;
    QString type;         // "R" or "S"
    Parameters customer;  // companyName, or title, firstName, surname
    QList<BodyLine> lines[SectionCount];

    /// The highest line number, including those of report items.
    int highestLine = 0;
};

/// Reads a quote document. Throws TypeMismatch with the reason if it is not one, or if its number can't be part of an
/// answer's file name.
QuoteDocument quoteDocument(const QString& text);

}  // namespace kest::app

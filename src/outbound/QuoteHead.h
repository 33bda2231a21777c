// Writes the part of a quote document before its body: the customer, the references and the vehicle.
#pragma once

#include "outbound/ExtraInfo.h"
#include "outbound/QuoteRows.h"
#include "platform/xml/Branch.h"

#include <QString>

#include <optional>

namespace kest {

/// How the document refers to the insurer's records: in exactly one of three ways.
struct InsurerReference {
    QString authorisedQuoteNumber;  // for a supplementary quote
    QString claimNumber;            // for a main quote without a request
    QString requestNumber;          // for a main quote with a request, as is the version
    QString requestVersion;
};
/// Returns the reference of the quote.
InsurerReference referenceOf(const QuoteRows& rows);

/// Returns the whole days from the arrival of the car to its completion, or nothing if one of the dates is missing.
std::optional<qint64> repairDays(const db::Recordset& quote);

/// Appends the elements before the body, in the document's order.
void addHead(const Branch& request, const QuoteRows& rows, const InsurerReference& reference,
             const std::optional<ExtraValues>& extra, std::optional<qint64> repairDays);

}  // namespace kest

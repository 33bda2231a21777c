// Everything of a quote document that stands before its body: whom it concerns, and the vehicle.
#pragma once

#include "outbound/ExtraInfo.h"
#include "outbound/QuoteRows.h"
#include "platform/xml/Branch.h"

#include <QString>

#include <optional>

namespace kest {

/// How the document points at the insurer's records: in exactly one of three ways.
struct InsurerReference {
    QString authorisedQuoteNumber;  // a supplementary quote's
    QString claimNumber;            // of a main quote without a request
    QString requestNumber;
    QString requestVersion;
};
InsurerReference referenceOf(const QuoteRows& rows);

/// Whole days from the car's coming in to its completion; none where one of the two dates is open.
std::optional<qint64> repairDays(const db::Recordset& quote);

/// Appends the elements before the body, in the document's order.
void addHead(const Branch& request, const QuoteRows& rows, const InsurerReference& reference,
             const std::optional<ExtraValues>& extra, std::optional<qint64> repairDays);

}  // namespace kest

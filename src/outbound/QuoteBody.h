// Writes the body of a quote document: labour, paint, parts, report items and sublets, their sums and the tax.
#pragma once

#include "base/QuoteKey.h"
#include "outbound/LineNumbers.h"
#include "platform/database/Recordset.h"
#include "platform/xml/Branch.h"

#include <QString>

#include <functional>

namespace kest {

/// The body of a quote document.
///
/// The amounts are calculated from the lines and differ from the totals of the quote header, which have other rules:
/// here a line marked as deleted counts, and each section rounds in its own way.
class QuoteBody {
public:
    /// Reads the lines of a quote.
    QuoteBody(const QuoteKey& key, const QString& authorisedNumber);

    /// Appends `quoteBody`, and numbers the lines and stores the numbers with them. Returns the quote total. If it is
    /// 0, the body is incomplete, because such a quote is not sent.
    double addTo(const Branch& request);

private:
    using Line = db::Recordset;
    using Skip = std::function<bool(const Line&)>;
    using Elements = std::function<Leaves(const Line&)>;

    void addLabours(const Branch& labours);
    void addPaints(const Branch& paints);
    void addParts(const Branch& parts);
    void addReportItems(const Branch* reportItems);
    void addSublets(const Branch* sublets);
    Leaves part(const Line& line);
    void walk(db::Recordset& lines, const Branch* section, const char* element, const Elements& elements,
              const Skip& skip = {});

    QString reference;
    bool isMainQuote;
    bool isAuthorised;
    LineNumbers numbers;

    db::Recordset removeAndReplace;
    db::Recordset repair;
    db::Recordset mechanical;
    db::Recordset miscellaneous;
    db::Recordset partLines;
    db::Recordset paint;
    db::Recordset otherPaint;
    db::Recordset sublet;
    db::Recordset reportItem;

    double labourSum = 0;
    double paintSum = 0;
    double partSum = 0;
    double markUpSum = 0;
};

}  // namespace kest

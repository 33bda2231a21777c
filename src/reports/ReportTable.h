// The in-memory tables of the reports. The templates rely on the names of their fields.
#pragma once

#include "platform/database/Recordset.h"

#include <span>

namespace kest {

/// The numbers of the reports.
enum ReportNumber : qint32 { QuoteRequestReport = 710, AssessmentReport = 720, ComparisonReport = 730 };

/// A field of a report table.
struct ReportField {
    const char* name;
    int size;  // characters; a longer value is cut
    db::Kind kind = db::Kind::Text;
};

/// Opens an empty table with these fields.
db::Recordset openReportTable(std::span<const ReportField> fields);

}  // namespace kest

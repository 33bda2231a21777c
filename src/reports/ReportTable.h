// The tables that reports are fed with: declared fields of fixed sizes, whose names are the templates' contract.
#pragma once

#include "platform/database/Recordset.h"

#include <span>

namespace kest {

enum ReportNumber : qint32 { QuoteRequestReport = 710, AssessmentReport = 720, ComparisonReport = 730 };

struct ReportField {
    const char* name;
    int size;  // characters; what is longer is cut
    db::Kind kind = db::Kind::Text;
};

/// An empty table of these fields, open.
db::Recordset openReportTable(std::span<const ReportField> fields);

}  // namespace kest

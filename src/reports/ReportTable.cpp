#include "reports/ReportTable.h"

namespace kest {

db::Recordset openReportTable(std::span<const ReportField> fields)
{
    db::Recordset table;
    for (const ReportField& field : fields)
        table.declare(QString::fromLatin1(field.name), field.kind, field.size);
    table.openDeclared();
    return table;
}

}  // namespace kest

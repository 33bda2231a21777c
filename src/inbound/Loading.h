// Functions that all loaders share.
#pragma once

#include "platform/database/Recordset.h"

#include <QString>
#include <QVariant>

#include <initializer_list>

namespace kest {

/// The name of a column and a value for it.
struct ColumnValue {
    QLatin1StringView name;
    QVariant value;
};
/// Sets columns of the current row in this order.
void setColumns(db::Recordset& row, std::initializer_list<ColumnValue> columns);
/// Sets the totals and the host's overrides to 0, and marks the quote as changed for the host.
void fillWithoutTotals(db::Recordset& quote);
/// Changes a car's colour to the spelling of the colour table, or clears it if the table does not have the colour.
void respellColour(db::Recordset& car, db::Recordset& colours);
/// Shows a box that says that the totals of a loaded quote could not be calculated or stored.
void tellOldTotals(const db::Recordset& quote);
/// Shows a critical box that says why a message is refused. Returns false.
bool refuse(const QString& text);

}  // namespace kest

// Writes the current row of a recordset to the base tables of its columns.
#pragma once

#include "platform/database/Change.h"
#include "platform/database/RecordsetData.h"

namespace kest::db {

/// Writes the pending change of the current row, or deletes the row. Leaves the pending change to its caller.
class Recordset::Data::Writer {
public:
    explicit Writer(Data& written) : data(written) {}

    /// Writes the columns that differ, each to its table. Throws RowChanged if someone else has changed the row.
    void write();
    /// Deletes the row in the table of the first column. Throws RowChanged if it is not there any more.
    void remove();

private:
    QStringList changedTables();
    bool isChanged(int column);
    QString keyCondition(const TableInfo& table);
    int resultColumn(const QString& table, const QString& column) const;
    QList<int> uncomparedTexts(const TableInfo& table);
    void checkTexts(const TableInfo& table, const QString& key, const QList<int>& texts);
    void writeChange(const QString& table);
    void writeInsert(const QString& table);
    RowChange rowChange(const TableInfo& table, ChangeKind kind, const QStringList& wanted);
    void readBack(const TableInfo& table, const QVariant& identity);
    QString insertedRow(const TableInfo& table);

    Data& data;
};

}  // namespace kest::db

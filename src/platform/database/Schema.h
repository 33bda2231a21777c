// What is known of a database's tables and columns.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest::db {

struct TableColumn {
    QString name;
    Kind kind = Kind::Text;
    int size = 0;    // of a text in characters; 0 is no limit
    int scale = -1;  // digits after the point of an exact number; -1 for a floating one
    bool identity = false;
    bool hasDefault = false;
};

struct TableInfo {
    QString name;  // the schema's spelling
    QList<TableColumn> columns;
    QStringList key;  // the columns of the primary key; empty if there is none

    const TableColumn* column(const QString& name) const;
    const TableColumn* identity() const;
};

class Schema {
public:
    virtual ~Schema() = default;
    /// Null for a table that the database does not have.
    virtual const TableInfo* table(const QString& name) = 0;
    /// The table's name as the database spells it; empty if there is no such table.
    virtual QString tableSpelling(const QString& name) = 0;
};

/// What a column of that declared type holds.
Kind kindOfType(const QString& declaredType);

}  // namespace kest::db

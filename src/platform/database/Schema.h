// Describes the tables and columns of a database.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest::db {

/// A column of a table.
struct TableColumn {
    QString name;
    Kind kind = Kind::Text;
    int size = 0;    // characters of a text; 0 means no limit
    int scale = -1;  // digits after the point, of an exact number or a date's second; -1 for a floating-point number
    int step = 1;    // seconds to which a date is rounded: a minute; a day cuts the time off
    bool isSingle = false;  // a floating-point number of single precision
    bool isText = false;    // bytes that a driver returns are text in UTF-8
    bool identity = false;
    bool readOnly = false;  // computed, a version of the row, or a type that no statement compares or writes
    bool hasDefault = false;
    QVariant fixedDefault = {};  // the default if it is a number or a text; null for any other expression
};

constexpr int secondsOfMinute = 60;
constexpr int secondsOfDay = 86400;

/// A table of the database.
struct TableInfo {
    QString name;  // the schema's spelling
    QList<TableColumn> columns;
    QStringList key;  // the columns of the primary key; empty if there is none

    /// Returns the column with that name, in any case, or null.
    const TableColumn* column(const QString& name) const;
    /// Returns the identity column, or null if there is none.
    const TableColumn* identity() const;
};

/// Looks up the tables of a database.
class Schema {
public:
    virtual ~Schema() = default;
    /// Returns a table, or null if the database does not have it.
    virtual const TableInfo* table(const QString& name) = 0;
    /// Returns a table's name in the spelling of the database, or an empty text if there is no such table.
    virtual QString tableSpelling(const QString& name) = 0;
};

/// Returns the value of a default as the schema spells it, such as "((0))" or "'A'", or null if it is no literal.
QVariant fixedDefault(QString text, Kind kind);
/// Returns the kind of a column with that declared type.
Kind kindOfType(const QString& declaredType);

}  // namespace kest::db

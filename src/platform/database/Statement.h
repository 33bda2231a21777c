// Statements are written in the dialect of SQL Server; this turns one into the dialect of the engine that answers.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest::db {

struct TableColumn {
    QString name;
    Kind kind = Kind::Text;
    int size = 0;
    bool identity = false;
    bool hasDefault = false;
};

struct TableInfo {
    QString name;  // the schema's spelling
    QList<TableColumn> columns;
    QStringList key;  // the columns of the primary key; empty where there is none

    const TableColumn* column(const QString& name) const;
    const TableColumn* identity() const;
};

/// What the translation asks about the database.
class Schema {
public:
    virtual ~Schema() = default;
    virtual const TableInfo* table(const QString& name) = 0;
    /// The table's name as the database spells it; empty where it is no table.
    virtual QString tableSpelling(const QString& name) = 0;
};

struct Dialect {
    bool top = false;               // "TOP n", not "LIMIT n" at the end
    bool plusJoinsTexts = false;    // "+", not "||"
    bool patternSets = false;       // LIKE knows "[...]", and passes over trailing blanks
    bool caseOfTables = false;      // names of tables are told apart by case
    bool backslashEscapes = false;  // a backslash in a literal is doubled
    bool isoDates = false;          // "T" between date and time in a literal
    QChar openQuote = u'"';
    QChar closeQuote = u'"';
};

/// Throws StatementFailed where a second statement stands behind a ";". Nothing inside a literal is touched, but a
/// literal that is compared with a number column becomes the number that it means: "''" is 0, and a text that is no
/// number equals no number.
QString translated(const QString& statement, const Dialect& dialect, Schema& schema);

}  // namespace kest::db

// How a database wants its statements written.
#pragma once

#include "platform/database/Recordset.h"

#include <QChar>
#include <QString>
#include <QVariant>

namespace kest::db {

struct Dialect {
    bool top = false;               // "TOP n", not "LIMIT n" at the end
    bool plusJoinsTexts = false;    // "+", not "||"
    bool patternSets = false;       // LIKE knows "[...]", and ignores trailing blanks
    bool caseOfTables = false;      // the names of tables are case-sensitive
    bool backslashEscapes = false;  // a backslash in a literal is doubled
    bool isoDates = false;          // "T" between date and time in a literal
    QChar openQuote = u'"';
    QChar closeQuote = u'"';
    QString defaultsOnly = QStringLiteral("DEFAULT VALUES");
    QString sameDate = QStringLiteral("%1=%2");  // that a date column holds the moment of a literal
    QString sameLongText = QString();            // that a long text is the literal, to the letter; empty: not possible

    QString quoted(const QString& identifier) const;
    /// A value as a literal that no value can end; Null as NULL. Throws Overflow for a number that is none.
    QString literal(const QVariant& value) const;
    /// The condition that a column still holds a value; empty for a long text that can't be compared.
    QString holds(const QString& column, Kind kind, const QVariant& value) const;
};

const Dialect& embeddedDialect();
const Dialect& mySqlDialect();
/// MariaDB and MySQL behind an ODBC driver, which reads a backslash in a literal.
const Dialect& mySqlOverOdbcDialect();
const Dialect& sqlServerDialect();

}  // namespace kest::db

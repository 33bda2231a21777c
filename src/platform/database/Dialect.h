// The dialect of a database.
#pragma once

#include "platform/database/Recordset.h"

#include <QChar>
#include <QString>
#include <QVariant>

namespace kest::db {

/// How a database expects its statements.
struct Dialect {
    bool top = false;               // uses "TOP n" instead of "LIMIT n" at the end
    bool plusJoinsTexts = false;    // uses "+" instead of "||"
    bool patternSets = false;       // LIKE supports "[...]" and ignores trailing blanks
    bool likeHasNoIndex = false;    // LIKE 'x%' searches all rows unless the range of 'x' is given, too
    bool caseOfTables = false;      // the names of tables are case-sensitive
    bool backslashEscapes = false;  // a backslash in a literal is doubled
    bool isoDates = false;          // "T" between date and time in a literal
    bool nationalTexts = false;     // only N'...' keeps letters outside of ASCII
    QChar openQuote = u'"';
    QChar closeQuote = u'"';
    QString defaultsOnly = QStringLiteral("DEFAULT VALUES");
    QString sameDate = QStringLiteral("%1=%2");     // the condition that a date column equals a literal
    QString sameLongText = QString();               // the same for a long text; empty if the database can't compare it
    QString begin = QStringLiteral("BEGIN");        // begins a transaction
    QString rollback = QStringLiteral("ROLLBACK");  // ends it, also if the server has ended it by itself
    QString lockedTable = QStringLiteral("%1");     // a table in a SELECT that locks its rows until the commit
    QString lockedEnd = QString();                  // the end of such a SELECT
    QString sessionNumber = QString();              // asks for the server's number of the connection
    QString withoutTransactions = QString();        // asks which tables of a list have changes that can't be taken back
    // how to ask for a column whose value a driver would round: finer than a millisecond, of more than 15 digits, or of
    // single precision
    QString exactDate = QStringLiteral("%1");
    QString exactDecimal = QStringLiteral("%1");
    QString exactSingle = QStringLiteral("%1");
    QString identityInsert = QString();  // with ON or OFF after it: lets an INSERT give the identity of its row

    /// Returns a literal with the prefix that its letters need. An index on a text column serves only one without.
    QString withPrefix(const QString& literal) const;
    /// Returns a quoted identifier.
    QString quoted(const QString& identifier) const;
    /// Returns a value as a literal, in which the value is escaped. Null is NULL. Throws Overflow for infinity and NaN.
    QString literal(const QVariant& value) const;
    /// Returns the condition that a column still has a value, or an empty text for a long text that can't be compared.
    /// `scale` is that of the column: a moment was read without what is finer than a millisecond.
    QString holds(const QString& column, Kind kind, const QVariant& value, int scale = 0) const;
};

const Dialect& embeddedDialect();
const Dialect& mySqlDialect();
/// The dialect of MariaDB and MySQL over ODBC, in which a backslash in a literal is an escape character.
const Dialect& mySqlOverOdbcDialect();
const Dialect& sqlServerDialect();

}  // namespace kest::db

// Provides the same small database on each engine, so that a test states a rule for all of them.
#pragma once

#include "platform/database/FaultInjection.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "support/MariaDbServer.h"
#include "support/TdsServer.h"
#include "support/Test.h"

namespace kest::test {

enum class On { Embedded, MySql, Odbc, Tds };

/// Creates the database on an engine and returns the text for its connection.
QString createDatabase(On engine);

/// The tables are LINE (id, the identity; CODE, SEQ, amount, flag, day, notes), CAR (REGO, the key; owner) and Tints
/// (Code, Script; no key). They compare values and have defaults as in the quote database.
class Databases : public ::testing::TestWithParam<On> {
protected:
    Databases();
    ~Databases() override { db::setStatementFault({}); }

    /// Returns true if a cell such as "embedded mysql" names the engine of this run.
    static bool isOneOf(const QString& engines)
    {
        const QStringList names{u"embedded"_s, u"mysql"_s, u"odbc"_s, u"tds"_s};
        const QStringList chosen = engines.split(u' ');
        if (!std::ranges::all_of(chosen, [&](const QString& engine) { return names.contains(engine); }))
            throw std::invalid_argument("no engines: " + engines.toStdString());
        return chosen.contains(names[int(GetParam())]);
    }
    db::ConnectionPtr connect() const;
    db::Recordset query(const QString& select) const;
    int count(const QString& condition) const;
    /// Returns all rows of a query, such as "CODE=A SEQ=Null".
    static QStringList rowsOf(const db::ConnectionPtr& connection, const QString& select);
    /// Executes a statement as another user.
    void elsewhere(const QString& statement) const { connect()->execute(statement); }
    /// Sets a column of the current row and updates the row. Returns the number of the error, or 0.
    static int written(db::Recordset& rows, const QString& column, const QVariant& value)
    {
        return failureOf([&] {
            rows.set(column, value);
            rows.update();
        });
    }
    /// Adds a row that has this value. Returns the number of the error, or 0.
    static int added(db::Recordset& rows, const QString& column, const QVariant& value)
    {
        rows.addNew();
        return written(rows, column, value);
    }
    /// Returns a date as a literal that a statement can store: as in the embedded file, or with a "T" for servers.
    static QString stored(const QString& day, const QString& time)
    {
        return u'\'' + day + (GetParam() == On::Embedded ? u' ' : u'T') + time + u'\'';
    }
    TestProfile profile;
    QString connectionText;
    db::ConnectionPtr connection;
};

}  // namespace kest::test

// An open database as Connection and Recordset use it: translates statements, describes results and converts values.
#pragma once

#include "platform/database/Engine.h"
#include "platform/database/Schema.h"
#include "platform/database/Statement.h"

#include <QHash>
#include <QList>
#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>
#include <optional>
#include <vector>

namespace kest::db {

/// A column of a result.
struct ResultColumn {
    QString name;
    QString table;  // the base table in the schema's spelling; empty if the column can't be changed
    Kind kind = Kind::Text;
    int size = 0;
    int scale = -1;  // as in TableColumn
};

/// Returns the numbers of columns by their names, as they are and in lower case. If several have the same name, it is
/// that of the first.
QHash<QString, int> columnNumbers(const QList<ResultColumn>& columns);

/// A completely fetched result, one row after the other.
struct Rows {
    QList<ResultColumn> columns;
    QHash<QString, int> columnNumbers = {};
    std::vector<QVariant> values = {};

    int count() const { return columns.isEmpty() ? 0 : int(values.size()) / int(columns.size()); }
};

/// A database and its schema. Each statement commits alone.
class Session final : Schema {
public:
    explicit Session(std::unique_ptr<Engine> engine) : engine_(std::move(engine)) {}

    Engine& engine() const { return *engine_; }
    const Dialect& dialect() const { return engine_->dialect(); }

    // These statements are in the dialect of SQL Server.

    /// Runs a query and returns its rows.
    Rows select(const QString& statement);
    /// Executes any other statement and returns the number of rows that it affects.
    qint64 execute(const QString& statement);

    // These statements are in the engine's own dialect. The recordset builds them.

    /// Runs a query whose columns are known.
    Rows selectNative(const QString& statement, const QList<ResultColumn>& columns);
    /// Executes any other statement and returns the number of rows that it affects.
    qint64 executeNative(const QString& statement);
    /// Inserts a row and returns its identity, or Null if the table has none.
    QVariant insert(const TableInfo& table, const QStringList& columns, const QStringList& literals);
    /// A condition on a table, from the dialect of SQL Server into the engine's own.
    QString translatedCondition(const QString& table, const QString& condition);
    /// Whole rows that nobody else may change until the transaction ends, with exact() values.
    Rows selectLocked(const TableInfo& table, const QString& condition);

    void begin();
    void commit();
    void rollback();
    /// Rolls back. If that fails, gives the connection up, because the next change would fail or, on some servers,
    /// commit this one too.
    void abandon();

    /// Returns a table, or null if the database does not have it. Asks the database only once. The result is valid
    /// until a definition changes.
    const TableInfo* table(const QString& name) override;

private:
    /// What is known of all statements of one shape.
    struct Known {
        Translated statement;
        QStringList names;            // of the last result
        QList<ResultColumn> columns;  // of the last result
        bool isDescribed = false;     // the columns don't depend on the values of the result
        QHash<QString, int> columnNumbers;
    };

    void checkFault();
    Known& known(const Shape& shape);
    void describe(Known& query, const Answer& answer);
    QString translatedText(const Shape& shape) { return known(shape).statement.text(shape.values, dialect()); }
    QString tableSpelling(const QString& name) override;
    void forgetSchema();

    std::unique_ptr<Engine> engine_;
    QHash<QString, QString> spellings;  // from lower case to the schema's spelling
    QHash<QString, std::shared_ptr<TableInfo>> tables;
    bool spellingsKnown = false;
    QHash<QString, Known> knownShapes;  // by the text of the shape
};

}  // namespace kest::db

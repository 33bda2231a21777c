// One open database as connection and recordset use it: statements are translated, results described, values converted.
#pragma once

#include "platform/database/Engine.h"
#include "platform/database/Schema.h"
#include "platform/database/SelectList.h"

#include <QHash>
#include <QList>
#include <QString>
#include <QStringList>
#include <QVariant>

#include <memory>
#include <optional>
#include <vector>

namespace kest::db {

struct ResultColumn {
    QString name;
    QString table;  // the base table in the schema's spelling; empty for a column that can't be changed
    Kind kind = Kind::Text;
    int size = 0;
    int scale = -1;  // as TableColumn has it
};

/// A result fetched whole, row after row.
struct Rows {
    QList<ResultColumn> columns;
    std::vector<QVariant> values;

    int count() const { return columns.isEmpty() ? 0 : int(values.size()) / int(columns.size()); }
};

class Session final : Schema {
public:
    explicit Session(std::unique_ptr<Engine> engine) : engine_(std::move(engine)) {}

    Engine& engine() const { return *engine_; }
    const Dialect& dialect() const { return engine_->dialect(); }

    // In the dialect of SQL Server:
    Rows select(const QString& statement);
    qint64 execute(const QString& statement);

    // In the engine's own dialect, as the recordset builds them:
    /// A query whose columns are known.
    Rows selectNative(const QString& statement, const QList<ResultColumn>& columns);
    qint64 executeNative(const QString& statement);
    /// Inserts the values and returns the identity that the database gave; Null if the table has none.
    QVariant insert(const TableInfo& table, const QStringList& columns, const QStringList& literals);

    /// Null for a table that the database does not have. Asked once a connection; valid until a definition changes.
    const TableInfo* table(const QString& name) override;

private:
    void checkFault();
    QString tableSpelling(const QString& name) override;
    void forgetSchema();

    std::unique_ptr<Engine> engine_;
    QHash<QString, QString> spellings;  // lower case to the schema's spelling
    QHash<QString, std::shared_ptr<TableInfo>> tables;
    bool spellingsKnown = false;
};

}  // namespace kest::db

// Reads the tables of a server from INFORMATION_SCHEMA.
#pragma once

#include "platform/database/Engine.h"

#include <QString>

namespace kest::db {

/// The parts of the queries that differ between servers.
struct InformationSchemaTerms {
    QString ofDatabase;  // the condition for the database of the connection
    QString type;        // the declared type of a column, or `readOnly`
    QString identity;    // 1 if the column is an identity
    QString single;      // the declared type of floating-point numbers of single precision

    static constexpr QLatin1StringView readOnly{"readonly"};  // see TableColumn
};

/// Returns the names of all tables.
QStringList tableNamesOf(Engine& engine, const InformationSchemaTerms& terms);
/// Returns a table, or null if there is none of that name.
std::unique_ptr<TableInfo> tableOf(Engine& engine, const InformationSchemaTerms& terms, const QString& name);

}  // namespace kest::db

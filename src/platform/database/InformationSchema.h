// What servers tell of their tables, through the views that they have in common.
#pragma once

#include "platform/database/Engine.h"

#include <QString>

namespace kest::db {

/// What each server says in its own words.
struct InformationSchemaTerms {
    QString ofDatabase;  // the condition for the database of the connection
    QString type;        // the declared type of a column
    QString identity;    // 1 for a column that the database numbers
};

QStringList tableNamesOf(Engine& engine, const InformationSchemaTerms& terms);
std::unique_ptr<TableInfo> tableOf(Engine& engine, const InformationSchemaTerms& terms, const QString& name);

}  // namespace kest::db

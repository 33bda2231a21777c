// The floor of a benchmark: plain statements on the database of the shop, on a connection of their own.
#pragma once

#include "platform/files/files.h"
#include "platform/profile.h"

#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>
#include <QSqlRecord>

#include <benchmark/benchmark.h>

namespace kest {

/// Executes a statement, reads its whole result, and returns the values of the first column.
inline QList<qint64> runPlain(const QString& statement)
{
    const QString name = QStringLiteral("plain");
    const QString file = files::systemPath(profile::root() + QStringLiteral("/databases/WirSql.db"));
    QSqlDatabase database = QSqlDatabase::contains(name) ? QSqlDatabase::database(name, false)
                                                         : QSqlDatabase::addDatabase(QStringLiteral("QSQLITE"), name);
    if (database.databaseName() != file) {
        database.close();
        database.setDatabaseName(file);
        if (!database.open() || !QSqlQuery(database).exec(QStringLiteral("PRAGMA synchronous=FULL")))
            qFatal("%s", qPrintable(database.lastError().text()));
    }
    QSqlQuery query(database);
    query.setForwardOnly(true);
    if (!query.exec(statement))
        qFatal("%s: %s", qPrintable(statement), qPrintable(query.lastError().text()));
    const int columns = query.record().count();
    QList<qint64> first;
    while (query.next()) {
        for (int column = 0; column < columns; ++column)
            benchmark::DoNotOptimize(query.value(column));
        first += query.value(0).toLongLong();
    }
    return first;
}

}  // namespace kest

// Measures a search in a fetched quote, and fetching a quote against the driver alone.
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/profile.h"

#include <QDir>
#include <QFile>
#include <QSqlDatabase>
#include <QSqlQuery>
#include <QTemporaryDir>

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;
using namespace kest;

namespace {

constexpr int mostRows = 10000;

const QString select = u"SELECT * FROM QUOTE2 WHERE itemid<=%1"_s;

/// An embedded database with the lines of a large quote.
class Lines {
public:
    Lines()
    {
        profile::setRoot(folder.path());
        QDir().mkpath(folder.filePath(u"databases"_s));
        QFile(file()).open(QIODevice::WriteOnly);
        connection = std::make_shared<db::Connection>();
        connection->open(u"Driver={none};Server=(local)\\;Database=lines;"_s);
        connection->execute(
            u"CREATE TABLE QUOTE2 (itemid INTEGER PRIMARY KEY, QTNNO VARCHAR(20) COLLATE NOCASE, Subquote INTEGER, "
            "SEQ_NO INTEGER, category VARCHAR(10) COLLATE NOCASE, script VARCHAR(100) COLLATE NOCASE, rrhour REAL, "
            "qty REAL, unitcost REAL, delitem BIT, itemno VARCHAR(10) COLLATE NOCASE)"_s);
        connection->execute(
            u"WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < %1) "
            "INSERT INTO QUOTE2 SELECT i, '1001', 0, i, 'PRT', 'BUMPER BAR FRONT', 1.5, 1, 99.5, 0, "
            "'780' FROM n"_s.arg(mostRows));
    }

    QString file() const { return folder.filePath(u"databases/lines.db"_s); }

    db::ConnectionPtr connection;

private:
    QTemporaryDir folder;
};

Lines& lines()
{
    static Lines made;
    return made;
}

void find(benchmark::State& state)
{
    db::Recordset rows(lines().connection);
    rows.open(select.arg(state.range(0)));
    int wanted = 0;
    for (auto step : state) {
        wanted = wanted % int(state.range(0)) + 1;
        rows.moveFirst();
        rows.find(sql("SEQ_NO='{}'", wanted));
        if (rows.absolutePosition() != wanted)
            state.SkipWithError("the line was not found");
    }
}

void open(benchmark::State& state)
{
    for (auto step : state) {
        db::Recordset rows(lines().connection);
        rows.open(select.arg(state.range(0)));
        benchmark::DoNotOptimize(rows.recordCount());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

/// Measures the floor: reads each value of the same rows once through the driver.
void openBare(benchmark::State& state)
{
    lines();
    {
        QSqlDatabase bare = QSqlDatabase::addDatabase(u"QSQLITE"_s, u"bare"_s);
        bare.setDatabaseName(lines().file());
        bare.open();
        for (auto step : state) {
            QSqlQuery query(bare);
            query.setForwardOnly(true);
            query.exec(select.arg(state.range(0)));
            while (query.next()) {
                for (int column = 0; column < 11; ++column)
                    benchmark::DoNotOptimize(query.value(column));
            }
        }
        state.SetItemsProcessed(state.iterations() * state.range(0));
    }
    QSqlDatabase::removeDatabase(u"bare"_s);
}

BENCHMARK(find)->RangeMultiplier(10)->Range(100, mostRows);
BENCHMARK(open)->RangeMultiplier(10)->Range(100, mostRows);
BENCHMARK(openBare)->RangeMultiplier(10)->Range(100, mostRows);

}  // namespace

// Measures an export to JobLink against plain INSERT statements on the same server.
#include "base/CredentialCipher.h"
#include "base/SharedVariables.h"
#include "jobexport/JobLinkSettings.h"
#include "jobexport/WriteQuote.h"
#include "platform/database/Sql.h"
#include "platform/profile.h"
#include "platform/script/Script.h"
#include "setup/Profile.h"
#include "shell/component.h"
#include "shell/eKEST.h"
#include "support/MariaDbServer.h"

#include <QElapsedTimer>
#include <QFile>
#include <QTemporaryDir>

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;
using namespace kest;

namespace {

/// A shop with a quote of `lines` lines, and a JobLink server.
class Shop {
public:
    Shop()
    {
        desktop::useScript(std::make_shared<desktop::Script>());
        profile::setRoot(folder.filePath(u"shop"_s));
        app::initProfile(registerClass, app::Shop::Demo);
        host = std::make_unique<eKEST>();
        QFile tables(QStringLiteral(KEST_SOURCE_DIR "/sql/joblink.sql"));
        if (!tables.open(QIODevice::ReadOnly))
            qFatal("no tables");
        server.createDatabase(u"jobs"_s, QString::fromUtf8(tables.readAll()));
        jobs.open(server.connectionText(u"jobs"_s));
        InitCipherKey();
        storeJobLinkSettings({u"127.0.0.1"_s, server.port(), u"jobs"_s, server.user(), server.password()});
    }

    void setLines(int lines)
    {
        gConn->execute(u"DELETE FROM QUOTE2 WHERE QTNNO='1004'"_s);
        gConn->execute(
            sql("WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < {}) INSERT INTO QUOTE2 "
                "(QTNNO, Subquote, SEQ_NO, category, script, rrhour, qty, tosend) "
                "SELECT '1004', 0, i, 'PRT', 'BUMPER BAR FRONT', 1.5, 1, 'A' FROM n",
                lines));
    }

    /// Writes the rows of the last export again, with statements that were prepared before.
    void writeBare(int lines)
    {
        db::Connection target;
        target.open(server.connectionText(u"jobs"_s));
        target.execute(u"INSERT INTO newJob SET Status=0"_s);
        target.execute(
            u"INSERT INTO newJobHdr (nJobID_FK, JobNr, estNr, estimateDate, paintType, insName, insAddr, insPcode, "
            "custName, custAddr, vehReg, vehMake, vehModel) VALUES (1, '1004', '1004', '21/03/2008', 'M1', 'KEST "
            "Universal Insurer', '1 High Street', '3121', 'Ms Mary Jane Lindqvist', '8 Paperbark Court', 'LQV606', "
            "'KIRRAWEE', 'BREEZE')"_s);
        for (int line = 1; line <= lines; ++line)
            target.execute(
                sql("INSERT INTO newJobDtl (nJobID_FK, coreTitle, lineDescn, lineSale, lineCost, lineNr, linePartNr, "
                    "linePartQty, linePartType, lineSupplierName) VALUES (1, 'PRT', 'BUMPER BAR FRONT', 1.5, 0, {}, "
                    "'', 1, 'OEM', '')",
                    line));
        target.execute(u"UPDATE newJob SET Status=1 WHERE nJobID_PK=1"_s);
    }

private:
    QTemporaryDir folder;
    test::MariaDbServer server;
    db::Connection jobs;
    std::unique_ptr<eKEST> host;
};

void exportOfLines(benchmark::State& state)
{
    static Shop shop;
    const int lines = int(state.range(0));
    shop.setLines(lines);
    qint64 exported = 0;
    qint64 bare = 0;
    for (auto _ : state) {
        QElapsedTimer clock;
        clock.start();
        WriteQuote(u"1004"_s, u"0"_s);
        const qint64 took = clock.nsecsElapsed();
        clock.restart();
        shop.writeBare(lines);
        bare += clock.nsecsElapsed();
        exported += took;
        state.SetIterationTime(double(took) / 1e9);
    }
    state.counters["us_per_line"] = double(exported) / 1e3 / double(state.iterations()) / lines;
    state.counters["ratio_to_bare_inserts"] = double(exported) / double(bare);
}
BENCHMARK(exportOfLines)->Arg(10)->Arg(100)->Arg(1000)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace

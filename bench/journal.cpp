// Measures what the journal costs: a recorded change against the same change without a record, both committed alone,
// and taking back an interrupted load of 5,000 lines.
#include "base/Journal.h"

#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "recovery/TakeBack.h"
#include "setup/QuoteDatabase.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QTemporaryDir>

#include <algorithm>
#include <cstdio>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr int lines = 5000;

/// Changes each line once. Returns the seconds of a change.
double secondsOfAChange(double hours)
{
    db::Recordset rows = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
    QElapsedTimer time;
    time.start();
    for (; !rows.eof(); rows.moveNext()) {
        rows.set(u"rrhour"_s, hours);
        rows.update();
    }
    return double(time.nsecsElapsed()) / 1e9 / rows.recordCount();
}

void addLines()
{
    db::Recordset rows = opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
    for (int line = 1; line <= lines; ++line) {
        rows.addNew();
        rows.set(u"QTNNO"_s, u"500"_s);
        rows.set(u"Subquote"_s, 0);
        rows.set(u"SEQ_NO"_s, line);
        rows.set(u"category"_s, u"R&R"_s);
        rows.set(u"script"_s, u"Front bumper bar"_s);
        rows.set(u"rrhour"_s, 2.5);
        rows.set(u"rr_rate2"_s, 1);
        rows.update();
    }
}

void measure()
{
    qint64 interrupted = 0;
    {
        journal::Operation load(journal::Kind::Load, u"m.xml"_s);
        addLines();
        interrupted = toLong(opened(u"SELECT MAX(Operation) AS n FROM KESTOperation"_s).value(u"n"_s));
    }
    const double bytes = toDouble(opened(u"SELECT SUM(LENGTH(RowData)) AS n FROM KESTJournal"_s).value(u"n"_s));
    std::printf("size of 1,000 records of new lines: %.0f KB\n", bytes / lines);

    double plain = 1e9;
    double recorded = 1e9;
    for (int round = 0; round < 3; ++round) {
        plain = std::min(plain, secondsOfAChange(10 + round));
        const journal::Operation operation(journal::Kind::Save);
        recorded = std::min(recorded, secondsOfAChange(20 + round));
    }
    std::printf("change: %.3f ms, recorded %.3f ms: %.2f times\n", plain * 1e3, recorded * 1e3, recorded / plain);

    secondsOfAChange(2.5);  // as the load has left them
    QElapsedTimer time;
    time.start();
    const qsizetype left = recovery::takeBack(interrupted).size();
    std::printf("taking back %d lines: %.2f s, %lld left\n", lines, double(time.elapsed()) / 1e3, qint64(left));
}

}  // namespace
}  // namespace kest

int main(int argumentCount, char** arguments)
{
    std::setvbuf(stdout, nullptr, _IOLBF, 0);
    const QCoreApplication application(argumentCount, arguments);
    const QTemporaryDir folder(QDir::currentPath() +
                               u"/bench-XXXXXX"_s);  // on a disk, because each change is committed
    kest::profile::setRoot(folder.path());
    kest::gcnDB = kest::gConn = kest::app::openEmbedded(u"WirSql"_s);
    kest::app::createTables(*kest::gConn, kest::app::Server::Embedded);
    kest::app::fillNewShop(*kest::gConn);
    kest::journal::watch(kest::gConn);
    kest::measure();
    kest::gConn.reset();
    kest::gcnDB.reset();
}

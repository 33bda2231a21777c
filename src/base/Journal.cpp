#include "base/Journal.h"

#include "base/JournalRecord.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/database/Change.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

#include <QCoreApplication>
#include <QCryptographicHash>
#include <QUuid>

#include <array>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

constexpr std::array kindWords{"load"_L1, "send"_L1, "save"_L1, "response"_L1};
constexpr std::array stateWords{"open"_L1, "done"_L1, "failed"_L1, "interrupted"_L1};

/// The operation at work.
struct Work {
    Kind kind = Kind::Load;
    QString file;
    QString hash;
    QString number;
    QString subquote;
    QString lockName;
    std::unique_ptr<db::Lock> lock;
    qint64 id = 0;             // 0 until its first change
    bool isCommitted = false;  // with that change
};

std::unique_ptr<Work> work;

QString now()
{
    return QDateTime::currentDateTime().toString(u"yyyy-MM-ddTHH:mm:ss"_s);
}

class Recorder final : public db::ChangeObserver {
public:
    bool observes(const QString& table) const override
    {
        return work && isKept && !table.startsWith("KESTOperation"_L1, Qt::CaseInsensitive) &&
               !table.startsWith("KESTJournal"_L1, Qt::CaseInsensitive);
    }
    QStringList wantedColumns() const override { return {u"QTNNO"_s, u"Subquote"_s}; }
    void changed(db::Connection& connection, const QList<db::RowChange>& rows) override;
    void committed() override { work->isCommitted = true; }
    void takenBack() override;

    bool isKept = false;

private:
    void openOperation(db::Connection& connection);
};

std::shared_ptr<Recorder> recorder = std::make_shared<Recorder>();

QVariant valueOf(const db::RowChange& row, const QString& name)
{
    const db::RowChange::Column* column = row.column(name);
    if (!column)
        return {};
    return row.kind == db::ChangeKind::Delete ? column->before : column->after;
}

void Recorder::openOperation(db::Connection& connection)
{
    work->lockName = u"operation "_s + QUuid::createUuid().toString(QUuid::WithoutBraces);
    work->lock = std::make_unique<db::Lock>(gConn, work->lockName);  // shows others that its owner is running
    db::Recordset row(gConn);
    row.open(u"SELECT * FROM KESTOperation WHERE Operation=0"_s);
    row.addNew();
    row.set(u"OperationKind"_s, wordOf(work->kind));
    row.set(u"State"_s, wordOf(State::Open));
    row.set(u"FileName"_s, work->file);
    row.set(u"FileHash"_s, work->hash);
    row.set(u"QTNNO"_s, work->number);
    row.set(u"Subquote"_s, work->subquote);
    row.set(u"Workstation"_s, GetComputerName());
    row.set(u"ProcessId"_s, QCoreApplication::applicationPid());
    row.set(u"ServerSession"_s, connection.serverSession());
    row.set(u"LockName"_s, work->lockName);
    row.set(u"StartedAt"_s, now());
    row.update();
    work->id = toLong(row.value(u"Operation"_s));
}

/// The operation's own row has gone with its first change.
void Recorder::takenBack()
{
    if (work->isCommitted)
        return;
    work->id = 0;
    work->lock.reset();
}

void Recorder::changed(db::Connection& connection, const QList<db::RowChange>& rows)
{
    for (const db::RowChange& row : rows) {
        const QVariant number = valueOf(row, u"QTNNO"_s);
        if (work->number.isEmpty() && !number.isNull()) {
            work->number = toText(number);
            work->subquote = textOrEmpty(valueOf(row, u"Subquote"_s));
        }
    }
    if (work->id == 0)
        openOperation(connection);
    const QString moment = now();
    for (const db::RowChange& row : rows) {
        const QVariant number = valueOf(row, u"QTNNO"_s);
        const QVariant subquote = valueOf(row, u"Subquote"_s);
        connection.execute(
            sql("INSERT INTO KESTJournal (Operation, ChangedAt, TableName, QTNNO, Subquote, RowData, "
                "Settled) VALUES ({}, '{}', '{}', '{}', '{}', '{}', 0)",
                work->id, moment, row.table, textOrEmpty(number), textOrEmpty(subquote), textOf(row)));
    }
}

}  // namespace

QString wordOf(Kind kind)
{
    return kindWords[size_t(kind)];
}

QString wordOf(State state)
{
    return stateWords[size_t(state)];
}

QString hashOf(const QString& text)
{
    return QString::fromLatin1(QCryptographicHash::hash(text.toUtf8(), QCryptographicHash::Sha256).toHex());
}

void watch(const db::ConnectionPtr& connection)
{
    static bool isTold = false;
    recorder->isKept = false;  // until the database has answered
    recorder->isKept = connection->hasTable(u"KESTOperation"_s) && connection->hasTable(u"KESTJournal"_s);
    connection->setObserver(recorder);
    if (!recorder->isKept && !isTold) {
        isTold = true;
        attempt([] {
            logFailure(
                RuntimeError(NoObject,
                             u"The database has no tables for the journal: what changes a quote is not recorded."_s),
                u"Journal.watch"_s);
        });
    }
}

bool isKept()
{
    return recorder->isKept;
}

bool isAtWork()
{
    return work != nullptr;
}

Operation::Operation(Kind kind, const QString& file, const QString& hash)
{
    if (work)
        return;
    isOutermost = true;
    work = std::make_unique<Work>();
    work->kind = kind;
    work->file = file;
    work->hash = hash;
}

Operation::~Operation()
{
    end(State::Failed);
}

void Operation::end(State state)
{
    if (!isOutermost || !work)
        return;
    const std::unique_ptr<Work> ended = std::move(work);
    if (ended->id == 0)
        return;
    attempt([&] {  // without a connection it stays open
        gConn->execute(sql("UPDATE KESTOperation SET State='{}', EndedAt='{}' WHERE Operation={} AND State='open'",
                           wordOf(state), now(), ended->id));
    });
}

}  // namespace kest::journal

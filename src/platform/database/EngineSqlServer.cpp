// The engine for SQL Server, with the driver of FreeTDS or of Microsoft.
#include "platform/RuntimeError.h"
#include "platform/database/EngineOdbc.h"
#include "platform/database/InformationSchema.h"

#include <QCryptographicHash>
#include <QHash>
#include <QRegularExpression>
#include <QScopeGuard>
#include <QSet>

#include <array>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int lockSeconds = 10;  // longer than the server waits for a lock

class EngineSqlServer final : public EngineOdbc {
public:
    explicit EngineSqlServer(std::unique_ptr<OdbcConnection> connection) : EngineOdbc(std::move(connection))
    {
        runShortly(u"SET NOCOUNT ON"_s);  // otherwise the counts of triggers come before that of the statement
    }

    const Dialect& dialect() const override { return sqlServerDialect(); }

    // triggers change neither @@ROWCOUNT nor SCOPE_IDENTITY()
    qint64 change(const QString& statement) override
    {
        static const QRegularExpression changesRows(u"\\A\\s*(INSERT|UPDATE|DELETE)\\b"_s,
                                                    QRegularExpression::CaseInsensitiveOption);
        if (!changesRows.match(statement).hasMatch())
            return run(statement).hit;
        return lastValue(run(statement + u"; SELECT @@ROWCOUNT"_s)).toLongLong();
    }
    QVariant insert(const QString& statement) override
    {
        const Answer answer = run(statement + u"; SELECT SCOPE_IDENTITY(), @@ROWCOUNT"_s);
        // an index that ignores duplicates refuses a row without an error
        if (answer.values.size() != 2 || answer.values[1].toLongLong() == 0)
            throw RuntimeError(StatementFailed, u"The database has not added the row."_s);
        const QVariant& identity = answer.values[0];
        return identity.isNull() ? QVariant() : QVariant(identity.toLongLong());
    }

    void setTimeout(int seconds) override
    {
        timeout = seconds;
        runShortly(u"SET LOCK_TIMEOUT "_s + QString::number(seconds > 0 ? qint64(seconds) * 1000 : -1));
    }

    QStringList tableNames() override { return tableNamesOf(*this, terms()); }
    std::unique_ptr<TableInfo> readTable(const QString& name) override { return tableOf(*this, terms(), name); }

    // checked here, because the server grants a lock twice to the same session
    bool lock(const QString& name, int seconds) override
    {
        if (locks.contains(name))
            return false;
        const Answer answer =
            run(u"DECLARE @r int; EXEC @r = sp_getapplock @Resource=%1, @LockMode='Exclusive', "
                "@LockOwner='Session', @LockTimeout=%2; SELECT @r"_s.arg(resource(name))
                    .arg(seconds * 1000),
                seconds + lockSeconds);
        constexpr int timedOut = -1;
        const QVariant result = lastValue(answer);
        if (result == QVariant(timedOut))
            return false;
        if (result.isNull() || result.toInt() < 0)
            throw RuntimeError(StatementFailed, u"The server refuses the lock (%1)."_s.arg(result.toString()));
        locks.insert(name);
        return true;
    }
    void unlock(const QString& name) override
    {
        if (!locks.remove(name))
            return;
        auto dropped = qScopeGuard([&] { drop(); });  // a lock that could not be released goes with its session
        run(u"EXEC sp_releaseapplock @Resource=%1, @LockOwner='Session'"_s.arg(resource(name)));
        dropped.dismiss();
    }

    void endSession(const QString& session, const QString& lock) override
    {
        // the server shows the first 32 characters of the lock's name
        const QString owner = lastValue(run(u"SELECT request_session_id FROM sys.dm_tran_locks WHERE "
                                            "resource_type='APPLICATION' AND request_session_id=%1 AND "
                                            "CHARINDEX(LEFT(%2, 32), resource_description) > 0"_s.arg(session.toInt())
                                                .arg(resource(lock))))
                                  .toString();
        if (!owner.isEmpty() && owner == session)
            run(u"KILL "_s + QString::number(session.toInt()));
    }

protected:
    int statementSeconds() const override { return timeout; }

    bool meansConnectionLost(const OdbcMessage& message) const override
    {
        static const QSet<int> codes{
            20003, 20004, 20006, 20017, 20047,  // of FreeTDS: timed out, read, write, end of file, connection dead
            // of Microsoft's drivers, as Windows numbers them. The numbers of other systems, such as 104 and 110, are
            // also errors of statements; with them the state says that the connection is lost.
            10050, 10051, 10052, 10053, 10054, 10057, 10058, 10060, 10061, 10064, 10065};
        static const std::array texts{"Communication link failure"_L1,  "Unexpected EOF"_L1,
                                      "Read from the server failed"_L1, "Write to the server failed"_L1,
                                      "is dead or not enabled"_L1,      "TCP Provider"_L1};
        return codes.contains(message.native) || std::any_of(texts.begin(), texts.end(), [&](QLatin1StringView text) {
                   return message.text.contains(text, Qt::CaseInsensitive);
               });
    }

    QString sqlState(const OdbcMessage& message) const override
    {
        static const QHash<int, QString> states{{-2, u"HYT00"_s},   {1222, u"HYT00"_s}, {1205, u"40001"_s},
                                                {229, u"42501"_s},  {230, u"42501"_s},  {207, u"42S22"_s},
                                                {208, u"42S02"_s},  {2601, u"23000"_s}, {2627, u"23000"_s},
                                                {4060, u"42000"_s}, {18456, u"28000"_s}};
        return states.value(message.native, message.state);
    }

private:
    static QVariant lastValue(const Answer& answer)
    {
        return answer.values.empty() ? QVariant() : answer.values.front();
    }

    /// Returns the name of a lock on the server, which can have 255 characters.
    static QString resource(const QString& name)
    {
        return u"N'kest2-"_s +
               QString::fromLatin1(QCryptographicHash::hash(name.toUtf8(), QCryptographicHash::Sha1).toHex()) + u'\'';
    }

    static const InformationSchemaTerms& terms()
    {
        static const InformationSchemaTerms terms{
            u"TABLE_CATALOG=DB_NAME() AND TABLE_SCHEMA=SCHEMA_NAME()"_s,
            u"CASE WHEN DATA_TYPE IN ('timestamp', 'rowversion', 'image', 'binary', 'varbinary', 'xml', 'sql_variant', "
            "'geometry', 'geography', 'hierarchyid') OR COLUMNPROPERTY(OBJECT_ID(TABLE_SCHEMA + '.' + TABLE_NAME), "
            "COLUMN_NAME, 'IsComputed')=1 THEN '"_s +
                InformationSchemaTerms::readOnly +
                u"' WHEN CHARACTER_MAXIMUM_LENGTH=-1 OR DATA_TYPE IN ('text', 'ntext') THEN 'longtext' "
                "ELSE DATA_TYPE END"_s,
            u"COLUMNPROPERTY(OBJECT_ID(TABLE_SCHEMA + '.' + TABLE_NAME), COLUMN_NAME, 'IsIdentity')"_s, u"real"_s};
        return terms;
    }

    int timeout = 0;
    QSet<QString> locks;
};

}  // namespace

std::unique_ptr<Engine> sqlServerOverOdbc(std::unique_ptr<OdbcConnection> connection)
{
    return std::make_unique<EngineSqlServer>(std::move(connection));
}

}  // namespace kest::db

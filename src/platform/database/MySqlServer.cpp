#include "platform/database/MySqlServer.h"

#include <QHash>
#include <QStringList>

namespace kest::db {

using namespace Qt::StringLiterals;

MySqlServer::MySqlServer(Engine& engine, const QString& version)
    : engine_(engine), isMariaDb(version.contains(u"MariaDB"_s, Qt::CaseInsensitive))
{
}

const InformationSchemaTerms& MySqlServer::informationSchema()
{
    static const InformationSchemaTerms terms{
        u"TABLE_SCHEMA=DATABASE()"_s,
        u"CASE WHEN EXTRA LIKE '%GENERATED%' THEN '"_s + InformationSchemaTerms::readOnly +
            u"' WHEN COLUMN_TYPE='tinyint(1)' THEN 'boolean' ELSE DATA_TYPE END"_s,
        u"CASE WHEN EXTRA LIKE '%auto_increment%' THEN 1 ELSE 0 END"_s, u"float"_s};
    return terms;
}

QString MySqlServer::timeoutStatement(int seconds) const
{
    return isMariaDb ? u"SET SESSION max_statement_time="_s + QString::number(seconds)
                     : u"SET SESSION max_execution_time="_s + QString::number(qint64(seconds) * 1000);
}

QString MySqlServer::lockName(const QString& name) const
{
    // locks belong to the server, so the name includes that of the database; a name can have 64 characters
    return u"SHA1(CONCAT(DATABASE(), '/', "_s + engine_.dialect().literal(name) + u"))"_s;
}

bool MySqlServer::lock(const QString& name, int seconds)
{
    if (locks.contains(name))
        return false;
    const Answer answer = engine_.run(u"SELECT GET_LOCK(%1, %2)"_s.arg(lockName(name)).arg(seconds));
    if (answer.values.front().toInt() != 1)
        return false;
    locks.insert(name);
    return true;
}

void MySqlServer::unlock(const QString& name)
{
    locks.remove(name);
    engine_.run(u"DO RELEASE_LOCK(%1)"_s.arg(lockName(name)));
}

void MySqlServer::endSession(const QString& session, const QString& lock)
{
    const QVariant owner = engine_.run(u"SELECT IS_USED_LOCK(%1)"_s.arg(lockName(lock))).values.front();
    if (!session.isEmpty() && owner.toString() == session)
        engine_.run(u"KILL CONNECTION "_s + QString::number(owner.toLongLong()));
}

bool MySqlServer::meansConnectionLost(const QString& nativeCode)
{
    static const QStringList lost{u"2002"_s, u"2003"_s, u"2006"_s, u"2013"_s,
                                  u"2055"_s, u"1927"_s, u"1053"_s, u"4031"_s};
    return lost.contains(nativeCode);
}

QString MySqlServer::sqlState(const QString& nativeCode)
{
    static const QHash<QString, QString> states{
        {u"1044"_s, u"42000"_s}, {u"1045"_s, u"28000"_s}, {u"1049"_s, u"42000"_s}, {u"1054"_s, u"42S22"_s},
        {u"1062"_s, u"23000"_s}, {u"1142"_s, u"42501"_s}, {u"1143"_s, u"42501"_s}, {u"1064"_s, u"42000"_s},
        {u"1146"_s, u"42S02"_s}, {u"1205"_s, u"HYT00"_s}, {u"1213"_s, u"40001"_s}, {u"1969"_s, u"70100"_s},
        {u"2002"_s, u"08001"_s}, {u"2003"_s, u"08001"_s}, {u"2005"_s, u"08001"_s}, {u"2006"_s, u"08S01"_s},
        {u"2013"_s, u"08S01"_s}};
    return states.value(nativeCode, u"HY000"_s);
}

}  // namespace kest::db

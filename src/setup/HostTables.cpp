#include "setup/HostTables.h"

#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Session.h"
#include "setup/QuoteDatabase.h"

#include <QRegularExpression>

namespace kest::app {

using namespace Qt::StringLiterals;
using db::Kind;

namespace {

/// Two kinds between which values convert without loss of what the component stores.
bool agree(Kind ours, Kind theirs)
{
    const auto isText = [](Kind kind) { return kind == Kind::Text || kind == Kind::LongText; };
    const auto isNumber = [](Kind kind) {
        return kind == Kind::Number || kind == Kind::WholeNumber || kind == Kind::Flag;
    };
    return ours == theirs || (isText(ours) && isText(theirs)) || (isNumber(ours) && isNumber(theirs));
}

void compare(const db::TableInfo& ours, const db::TableInfo* theirs, HostTables& result)
{
    if (!theirs) {
        result.missing += u"there is no table "_s + ours.name;
        return;
    }
    for (const db::TableColumn& column : ours.columns) {
        const QString name = ours.name + u'.' + column.name;
        const db::TableColumn* found = theirs->column(column.name);
        if (!found)
            result.missing += u"there is no column "_s + name;
        else if (found->readOnly && !column.readOnly)
            result.missing += name + u" can't be written"_s;
        else if (!agree(column.kind, found->kind))
            result.missing += name + u" holds another kind of value"_s;
        else if (found->kind == Kind::Text && found->size > 0 && (column.size == 0 || found->size < column.size))
            result.notes += u"%1 takes only %2 characters"_s.arg(name).arg(found->size);
        if (found && column.identity && !found->identity)
            result.missing += name + u" is not numbered by the database"_s;
    }
    if (theirs->key.isEmpty())
        result.notes += u"%1 has no primary key: a row is found by all of its columns"_s.arg(ours.name);
}

/// The tables as the scripts of this component make them.
QList<db::TableInfo> ownTables()
{
    static const QRegularExpression table(u"\\ACREATE TABLE (\\w+) \\((.*)\\)"_s,
                                          QRegularExpression::DotMatchesEverythingOption);
    static const QRegularExpression column(u"^\\s*(\\w+)\\s+(\\w+)(?:\\((\\d+)\\))?([^,\\n]*)"_s,
                                           QRegularExpression::MultilineOption);
    QList<db::TableInfo> tables;
    for (const QString& statement : schemaStatements(Server::Embedded)) {
        const QRegularExpressionMatch found = table.match(statement);
        if (!found.hasMatch())
            continue;
        db::TableInfo info{.name = found.captured(1), .columns = {}, .key = {}};
        for (const QRegularExpressionMatch& line : column.globalMatch(found.captured(2)))
            info.columns += db::TableColumn{.name = line.captured(1),
                                            .kind = db::kindOfType(line.captured(2)),
                                            .size = line.captured(3).toInt(),
                                            .identity = line.captured(4).contains(u"AUTOINCREMENT"_s)};
        tables += info;
    }
    return tables;
}

void noteTriggers(const db::ConnectionPtr& connection, const QString& select, QStringList& notes)
{
    db::Recordset triggers(connection);
    triggers.open(select);
    for (; !triggers.eof(); triggers.moveNext())
        notes += u"%1 has the trigger %2"_s.arg(triggers.text(u"parent"_s), triggers.text(u"name"_s));
}

}  // namespace

Server serverOf(const db::ConnectionPtr& connection)
{
    const db::Dialect& dialect = connection->session().dialect();
    return dialect.top ? Server::SqlServer : dialect.caseOfTables ? Server::MySql : Server::Embedded;
}

HostTables lookAtHostTables(const db::ConnectionPtr& connection)
{
    HostTables result;
    for (const db::TableInfo& ours : ownTables())
        compare(ours, connection->session().table(ours.name), result);
    if (serverOf(connection) == Server::SqlServer)
        noteTriggers(connection,
                     u"SELECT OBJECT_NAME(parent_id) AS parent, name FROM sys.triggers WHERE is_disabled=0 AND "
                     "OBJECT_SCHEMA_NAME(parent_id)=SCHEMA_NAME()"_s,
                     result.notes);
    else if (serverOf(connection) == Server::MySql)
        noteTriggers(connection,
                     u"SELECT EVENT_OBJECT_TABLE AS parent, TRIGGER_NAME AS name FROM INFORMATION_SCHEMA.TRIGGERS "
                     "WHERE TRIGGER_SCHEMA=DATABASE()"_s,
                     result.notes);
    return result;
}

}  // namespace kest::app

#include "setup/PrepareDatabase.h"

#include "platform/database/Recordset.h"
#include "platform/database/Session.h"
#include "setup/HostTables.h"
#include "setup/QuoteDatabase.h"

#include <QRegularExpression>

#include <algorithm>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

struct ExistingIndex {
    QString table;
    QString name;
    QStringList columns;
};

/// Returns the question for the columns of all indexes that serve every search, in order.
QString questionFor(Server server)
{
    switch (server) {
        case Server::Embedded:
            return u"SELECT m.tbl_name AS owner, m.name AS name, i.name AS part FROM sqlite_master m, "
                   "pragma_index_list(m.tbl_name) l, pragma_index_info(m.name) i WHERE m.type='index' AND "
                   "l.name=m.name AND l.partial=0 ORDER BY m.name, i.seqno"_s;
        case Server::MySql:
            return u"SELECT TABLE_NAME AS owner, INDEX_NAME AS name, COLUMN_NAME AS part FROM "
                   "INFORMATION_SCHEMA.STATISTICS WHERE TABLE_SCHEMA=DATABASE() AND INDEX_TYPE='BTREE' "
                   "ORDER BY TABLE_NAME, INDEX_NAME, SEQ_IN_INDEX"_s;
        case Server::SqlServer:
            break;
    }
    return u"SELECT OBJECT_NAME(i.object_id) AS owner, i.name AS name, COL_NAME(c.object_id, c.column_id) AS part FROM "
           "sys.indexes i INNER JOIN sys.index_columns c ON c.object_id=i.object_id AND c.index_id=i.index_id "
           "WHERE c.key_ordinal>0 AND i.is_disabled=0 AND i.has_filter=0 AND i.is_hypothetical=0 AND "
           "OBJECT_SCHEMA_NAME(i.object_id)=SCHEMA_NAME() ORDER BY i.object_id, i.index_id, c.key_ordinal"_s;
}

QList<ExistingIndex> existingIndexes(const db::ConnectionPtr& connection)
{
    QList<ExistingIndex> indexes;
    db::Recordset parts(connection);
    parts.open(questionFor(serverOf(connection)));
    for (; !parts.eof(); parts.moveNext()) {
        const QString table = parts.text(u"owner"_s);
        const QString name = parts.text(u"name"_s);
        if (indexes.isEmpty() || indexes.last().table != table || indexes.last().name != name)
            indexes.append({table, name, {}});
        indexes.last().columns.append(parts.text(u"part"_s));
    }
    return indexes;
}

bool isServedBy(const Index& wanted, const ExistingIndex& existing)
{
    return wanted.table.compare(existing.table, Qt::CaseInsensitive) == 0 &&
           wanted.columns.size() <= existing.columns.size() &&
           std::equal(wanted.columns.begin(), wanted.columns.end(), existing.columns.begin(),
                      [](const QString& ours, const QString& theirs) {
                          return ours.compare(theirs, Qt::CaseInsensitive) == 0;
                      });
}

bool isServed(const Index& wanted, const QList<ExistingIndex>& existing)
{
    return std::any_of(existing.begin(), existing.end(),
                       [&](const ExistingIndex& found) { return isServedBy(wanted, found); });
}

/// Returns the statements that create what the journal lacks, of which another attempt may have created a part.
QStringList missingOfJournal(const db::ConnectionPtr& connection, const QList<ExistingIndex>& existing)
{
    const QStringList statements = journalStatements(serverOf(connection));
    QStringList there;
    for (const Index& index : indexesIn(statements))
        if (isServed(index, existing))
            there.append(index.statement);
    static const QRegularExpression tableOf(u"\\ACREATE TABLE (\\w+)"_s);
    for (const QString& statement : statements)
        if (const auto table = tableOf.match(statement); table.hasMatch() && connection->hasTable(table.captured(1)))
            there.append(statement);
    QStringList missing = statements;
    missing.removeIf([&](const QString& statement) { return there.contains(statement); });
    return missing;
}

bool hasColumns(const db::ConnectionPtr& connection, const Index& index)
{
    const db::TableInfo* table = connection->session().table(index.table);
    return table && std::all_of(index.columns.begin(), index.columns.end(),
                                [&](const QString& column) { return table->column(column) != nullptr; });
}

}  // namespace

QList<MissingPart> missingParts(const db::ConnectionPtr& connection)
{
    QList<MissingPart> missing;
    const QList<ExistingIndex> existing = existingIndexes(connection);
    for (const Index& index : quoteIndexes()) {
        if (!isServed(index, existing) && hasColumns(connection, index))
            missing.append({u"index of %1 by %2"_s.arg(index.table, index.columns.join(u", "_s)), {index.statement}});
    }
    const QStringList journal = missingOfJournal(connection, existing);
    if (!journal.isEmpty())
        missing.append({u"journal (KESTOperation, KESTJournal)"_s, journal});
    return missing;
}

void createParts(const db::ConnectionPtr& connection, const QList<MissingPart>& parts)
{
    connection->setCommandTimeout(0);  // an index on a large table takes long
    for (const MissingPart& part : parts) {
        for (const QString& statement : part.statements)
            connection->execute(statement);
    }
}

}  // namespace kest::app

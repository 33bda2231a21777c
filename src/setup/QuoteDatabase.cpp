#include "setup/QuoteDatabase.h"

#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"

#include <QFile>
#include <QRegularExpression>

static void registerFiles()  // outside the namespaces, as the macro requires
{
    Q_INIT_RESOURCE(sql);
    Q_INIT_RESOURCE(templates);
}

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QString script(const QString& name)
{
    registerResources();
    QFile file(u":/sql/"_s + name);
    if (!file.open(QIODevice::ReadOnly))
        throw RuntimeError(FileNotFound, u"The script %1 is missing."_s.arg(name));
    return QString::fromUtf8(file.readAll());
}

void run(db::Connection& database, const QString& text)
{
    for (const QString& statement : statementsIn(text))
        database.execute(statement);
}

/// Returns the statements of a script that differs by the kind of server.
QStringList statementsFor(Server server, const QString& what)
{
    const QString kind = server == Server::Embedded ? u"embedded"_s
                         : server == Server::MySql  ? u"mariadb"_s
                                                    : u"sqlserver"_s;
    return statementsIn(script(u"%1-%2.sql"_s.arg(what, kind)));
}

}  // namespace

void registerResources()
{
    registerFiles();
}

QStringList schemaStatements(Server server)
{
    return statementsFor(server, u"quote"_s);
}

void createTables(db::Connection& database, Server server)
{
    for (const QString& statement : schemaStatements(server))
        database.execute(statement);
    for (const Index& index : quoteIndexes())
        database.execute(index.statement);
    createJournal(database, server);
}

QList<Index> indexesIn(const QStringList& statements)
{
    static const QRegularExpression form(u"^CREATE INDEX (\\w+) ON (\\w+) \\((.+)\\)$"_s);
    QList<Index> indexes;
    for (const QString& statement : statements) {
        const auto parts = form.match(statement);
        if (parts.hasMatch())
            indexes.append({parts.captured(1), parts.captured(2), parts.captured(3).split(u", "_s), statement});
    }
    return indexes;
}

QList<Index> quoteIndexes()
{
    return indexesIn(statementsIn(script(u"quote-indexes.sql"_s)));
}

void repairIndexes(db::Connection& database)
{
    database.rebuildIndexes();
    for (const Index& index : quoteIndexes())
        database.execute(QString(index.statement).replace("INDEX "_L1, "INDEX IF NOT EXISTS "_L1));
}

QStringList journalStatements(Server server)
{
    return statementsFor(server, u"journal"_s);
}

void createJournal(db::Connection& database, Server server)
{
    for (const QString& statement : journalStatements(server))
        database.execute(statement);
}

void fillNewShop(db::Connection& database)
{
    run(database, script(u"new-shop.sql"_s));
}

void fillDemoShop(db::Connection& database, const QDate& today)
{
    run(database, withDates(script(u"demo-shop.sql"_s), today));
}

QString embeddedFile(const QString& name)
{
    return u"%1/databases/%2.db"_s.arg(profile::root(), name);
}

db::ConnectionPtr openEmbedded(const QString& name)
{
    const QString file = embeddedFile(name);
    if (!files::exists(file)) {
        files::makeFolder(profile::root() + u"/databases"_s);
        files::writeBytes(file, {});
    }
    // no machine registers this driver with ODBC, so the connection uses the embedded engine
    auto database = std::make_shared<db::Connection>();
    database->setCommandTimeout(0);  // a large database takes long to set up
    database->open(u"Driver={embedded};Server=(local)\\;Database=%1;"_s.arg(name));
    return database;
}

QStringList statementsIn(const QString& script)
{
    // a literal, a comment or a single character
    static const QRegularExpression token(u"'(?:[^']|'')*'|--[^\\n]*|."_s,
                                          QRegularExpression::DotMatchesEverythingOption);
    QStringList statements;
    QString statement;
    for (const auto& match : token.globalMatch(script)) {
        const QString text = match.captured();
        if (text == u";"_s) {
            statements << statement.trimmed();
            statement.clear();
        } else if (!text.startsWith(u"--"_s)) {
            statement += text;
        }
    }
    statements << statement.trimmed();
    statements.removeAll(QString());
    return statements;
}

QString withDates(QString text, const QDate& today)
{
    static const QRegularExpression dayToken(u"@(date|short)([+-]\\d+)@"_s);
    qsizetype from = 0;
    for (auto match = dayToken.match(text); match.hasMatch(); match = dayToken.match(text, from)) {
        const QDate day = today.addDays(match.captured(2).toInt());
        const QString date = match.captured(1) == u"date"_s ? day.toString(Qt::ISODate) : shortDate(day);
        text.replace(match.capturedStart(), match.capturedLength(), date);
        from = match.capturedStart() + date.size();
    }
    return text;
}

}  // namespace kest::app

#include "platform/Databases.h"

#include "setup/QuoteDatabase.h"
#include "support/OdbcDrivers.h"

const auto mariaDbSchema =
    uR"(
CREATE TABLE LINE (id INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY, CODE VARCHAR(20), SEQ INTEGER,
    amount FLOAT DEFAULT 0, flag BIT DEFAULT 0, day DATETIME, notes LONGTEXT);
CREATE TABLE CAR (REGO VARCHAR(20) NOT NULL PRIMARY KEY, owner VARCHAR(30), CODE VARCHAR(20));
CREATE TABLE Tints (Code VARCHAR(20), Script VARCHAR(30) DEFAULT 'none');)"_s;

static QString embeddedSchema()
{
    static const QRegularExpression text(u"(VARCHAR\\(\\d+\\)|LONGTEXT)"_s);
    return QString(mariaDbSchema)
        .replace(u"NOT NULL AUTO_INCREMENT PRIMARY KEY"_s, u"PRIMARY KEY AUTOINCREMENT"_s)
        .replace(u"FLOAT"_s, u"REAL"_s)
        .replace(text, u"\\1 COLLATE NOCASE"_s);
}

QString test::createDatabase(On engine)
{
    switch (engine) {
        case On::Embedded: {
            const db::ConnectionPtr made = app::openEmbedded(u"shop"_s);
            for (const QString& statement : app::statementsIn(embeddedSchema()))
                made->execute(statement);
            return u"Driver={SQL Server};Server=(local)\\;Database=shop;Uid=sa;Pwd=x;"_s;
        }
        case On::Tds:
            tdsServer().createDatabase(u"shop"_s, TdsServer::schemaOf(mariaDbSchema));
            return tdsServer().connectionText(u"shop"_s);
        default:
            mariaDb().createDatabase(u"shop"_s, mariaDbSchema);
            return engine == On::MySql ? mariaDb().connectionText(u"shop"_s)
                                       : mariaDb().connectionText(u"shop"_s, odbcMariaDb);
    }
}

Databases::Databases() : connectionText(createDatabase(GetParam())), connection(connect()) {}

db::ConnectionPtr Databases::connect() const
{
    auto made = std::make_shared<db::Connection>();
    made->open(connectionText);
    return made;
}

db::Recordset Databases::query(const QString& select) const
{
    db::Recordset rows(connection);
    rows.open(select);
    return rows;
}

QStringList Databases::rowsOf(const db::ConnectionPtr& connection, const QString& select)
{
    QStringList all;
    db::Recordset rows(connection);
    for (rows.open(select); !rows.eof(); rows.moveNext()) {
        QStringList values;
        for (const QString& column : rows.columns())
            values += column.toUpper() + u'=' + (rows.isNull(column) ? u"Null"_s : rows.text(column));
        all += values.join(u' ');
    }
    return all;
}

int Databases::count(const QString& condition) const
{
    return query(u"SELECT * FROM LINE WHERE "_s + condition).recordCount();
}

#include "support/ShopDatabase.h"

#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "setup/PrepareDatabase.h"
#include "setup/QuoteDatabase.h"
#include "support/MariaDbServer.h"
#include "support/TdsServer.h"
#include "support/Test.h"

#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>

namespace kest::test {

const auto shopName = u"WirSql"_s;  // the default on every engine
const auto plainName = u"plain"_s;

static void fillShop(db::Connection& database)
{
    app::fillNewShop(database);
    database.execute(
        u"INSERT INTO MODEL (MODEL_ID, MODEL_ID1, MAKE, MODEL) VALUES ('C120', 'C120', 'CORELLA', 'MERIDIAN GL')"_s);
    database.execute(
        u"INSERT INTO ALLMODEL (MODEL_ID, MAKE, MODEL, SCHEDULE) VALUES ('C120', 'CORELLA', 'MERIDIAN GL', '')"_s);
}

/// Returns the file of a new shop.
static QByteArray newShopFile()
{
    const db::ConnectionPtr database = app::openEmbedded(shopName);
    app::createTables(*database, app::Server::Embedded);
    fillShop(*database);
    database->close();
    return files::readBytes(app::embeddedFile(shopName));
}

/// The shop's database on a server. Keeps copies of it, because creating tables would be the slowest part of a test.
class ServerShop {
public:
    ServerShop(QString name, QString ownNumber, QString driver)
        : serverName(std::move(name)), connectionNumber(std::move(ownNumber)), qtDriver(std::move(driver))
    {
    }
    virtual ~ServerShop() = default;
    virtual void copy(const QString& from, const QString& to) = 0;
    /// Opens a connection that is not the component's.
    virtual void open(QSqlDatabase& plain) const = 0;

    const QString serverName;        // as a setting
    const QString connectionNumber;  // a query for the server's number of a connection
    const QString qtDriver;
    const db::ConnectionPtr administrator = std::make_shared<db::Connection>();

    const QString shop = shopName;
    const QString saved = u"saved"_s;
    const QString fresh = u"fresh"_s;
};

class MariaDbShop final : public ServerShop {
public:
    MariaDbShop() : ServerShop(u"mysql:127.0.0.1:%1"_s.arg(mariaDb().port()), u"CONNECTION_ID()"_s, u"QMYSQL"_s)
    {
        for (const QString& name : {shop, saved, fresh})
            mariaDb().createDatabase(name);
        administrator->open(mariaDb().connectionText(fresh));
        app::createTables(*administrator, app::Server::MySql);
        fillShop(*administrator);
        db::Recordset names(administrator);
        names.open(u"SELECT TABLE_NAME, AUTO_INCREMENT FROM INFORMATION_SCHEMA.TABLES WHERE TABLE_SCHEMA=DATABASE()"_s);
        for (; !names.eof(); names.moveNext()) {
            const QString table = names.text(u"TABLE_NAME"_s);
            tables_[table] = !names.isNull(u"AUTO_INCREMENT"_s);
            for (const QString& name : {shop, saved})
                administrator->execute(u"CREATE TABLE %1.%2 LIKE %2"_s.arg(name, table));
        }
    }

    void copy(const QString& from, const QString& to) override
    {
        for (auto table = tables_.begin(); table != tables_.end(); ++table) {
            const QString clear = table.value() ? u"TRUNCATE TABLE "_s : u"DELETE FROM "_s;  // DELETE keeps the counter
            administrator->execute(clear + to + u'.' + table.key());
            administrator->execute(u"INSERT INTO %1.%3 SELECT * FROM %2.%3"_s.arg(to, from, table.key()));
        }
    }

    void open(QSqlDatabase& plain) const override
    {
        plain.setHostName(u"127.0.0.1"_s);
        plain.setPort(mariaDb().port());
        plain.setDatabaseName(shop);
        EXPECT_TRUE(plain.open(mariaDb().user(), mariaDb().password()));
        QSqlQuery(plain).exec(u"SET sql_mode='NO_BACKSLASH_ESCAPES'"_s);
    }

private:
    QMap<QString, bool> tables_;  // true if the table numbers its rows
};

class TdsShop final : public ServerShop {
public:
    TdsShop() : ServerShop(tdsServer().address(), u"@@SPID"_s, u"QODBC"_s)
    {
        for (const QString& name : {shop, saved})
            tdsServer().createDatabase(name);
        tdsServer().createDatabase(fresh,
                                   TdsServer::schemaOf(app::schemaStatements(app::Server::MySql).join(u";\n"_s)));
        administrator->open(tdsServer().connectionText(fresh));
        fillShop(*administrator);
        app::createParts(administrator, app::missingParts(administrator));
    }

    void copy(const QString& from, const QString& to) override
    {
        administrator->execute(u"EXEC standin_copy @from='%1', @to='%2'"_s.arg(from, to));
    }

    void open(QSqlDatabase& plain) const override
    {
        plain.setDatabaseName(tdsServer().connectionText(shop) + u"ClientCharset=UTF-8"_s);  // in any locale
        EXPECT_TRUE(plain.open());
    }
};

static ServerShop& serverShop()
{
    static const std::unique_ptr<ServerShop> made = qgetenv("KEST2_TEST_ENGINE") == "tds"
                                                        ? std::unique_ptr<ServerShop>(new TdsShop)
                                                        : std::make_unique<MariaDbShop>();
    return *made;
}

bool shopIsOnServer()
{
    return !qEnvironmentVariableIsEmpty("KEST2_TEST_ENGINE");
}

void dropConnection()
{
    if (!shopIsOnServer())
        gConn->close();
    else
        serverShop().administrator->execute(
            u"KILL "_s + opened(u"SELECT %1 AS id"_s.arg(serverShop().connectionNumber)).text(u"id"_s));
}

QList<QSqlRecord> plainRows(const QString& select)
{
    const bool isFile = !shopIsOnServer();
    if (!QSqlDatabase::contains(plainName))
        QSqlDatabase::addDatabase(isFile ? u"QSQLITE"_s : serverShop().qtDriver, plainName);
    QSqlDatabase database = QSqlDatabase::database(plainName, false);
    if (isFile && database.databaseName() != app::embeddedFile(shopName)) {
        database.close();
        database.setDatabaseName(app::embeddedFile(shopName));
    }
    if (!database.isOpen())
        isFile ? void(database.open()) : serverShop().open(database);
    QSqlQuery query(database);
    query.setForwardOnly(true);  // otherwise QODBC asks for a cursor on the server
    EXPECT_TRUE(query.exec(select)) << select.toStdString() << ": " << query.lastError().text().toStdString();
    QList<QSqlRecord> rows;
    while (query.next())
        rows.append(query.record());
    return rows;
}

QString plainText(const QVariant& value)
{
    static const QRegularExpression date(u"^\\d{4}-\\d\\d-\\d\\d( \\d\\d:\\d\\d:\\d\\d(\\.\\d+)?)?$"_s);
    if (value.isNull())
        return {};
    if (value.typeId() == QMetaType::Bool)
        return QString::number(value.toInt());
    if (value.typeId() == QMetaType::Double || value.typeId() == QMetaType::QDateTime)
        return toText(value);
    const QString text = value.toString();
    if (text.size() == 1 && text[0] < u'\2')  // a flag's raw bit
        return QString::number(text[0].unicode());
    return date.match(text).hasMatch() ? toText(toDate(text)) : text;
}

void makeShopDatabase()
{
    if (!shopIsOnServer()) {
        static const QByteArray file = newShopFile();  // only once, because creating tables is slow
        files::makeFolder(profile::root() + u"/databases"_s);
        files::writeBytes(app::embeddedFile(shopName), file);
        return;
    }
    serverShop().copy(serverShop().fresh, serverShop().shop);
    setSetting(u"ServerName"_s, serverShop().serverName);
}

void closeConnections()
{
    gConn->close();
    QSqlDatabase::database(plainName, false).close();
}

constexpr const char* tables[] = {"QUOTE1", "QUOTE2",          "QUOTE3", "CAR",   "CUSTOMER", "INSURER",     "CINFO",
                                  "VENDOR", "ALLMODEL",        "MODEL",  "BODY2", "JOBSTAGE", "KESTColours", "SUBLET",
                                  "DEBTOR", "ReportDefinition"};

static QString driveC()
{
    return profile::root() + u"/drive_c"_s;
}

static QMap<QString, QByteArray> filesOnDisk()
{
    QMap<QString, QByteArray> found;
    QDirIterator walk(driveC(), QDir::Files | QDir::Hidden, QDirIterator::Subdirectories);
    while (walk.hasNext()) {
        QFile file(walk.next());
        if (file.open(QIODevice::ReadOnly))
            found.insert(file.fileName(), file.readAll());
    }
    return found;
}

std::string holdings()
{
    QStringList lines;
    for (const char* table : tables) {
        const QString name = QString::fromLatin1(table);
        QStringList ofTable;
        for (const QSqlRecord& row : plainRows(u"SELECT * FROM "_s + name)) {
            QStringList values{name};
            for (int i = 0; i < row.count(); ++i)
                if (row.fieldName(i) != u"itemid"_s)  // a line that is stored again gets another one
                    values += row.fieldName(i) + u'=' + (row.isNull(i) ? u"Null"_s : plainText(row.value(i)));
            ofTable += values.join(u' ');
        }
        ofTable.sort();
        lines += ofTable;
    }
    const QMap<QString, QByteArray> files = filesOnDisk();
    for (auto file = files.begin(); file != files.end(); ++file)
        lines += file.key().sliced(driveC().size()) + u": "_s + QString::fromLatin1(file.value());
    return lines.join(u'\n').toStdString();
}

std::string difference(const std::string& expected, const std::string& found)
{
    const QStringList before = QString::fromStdString(expected).split(u'\n');
    const QStringList after = QString::fromStdString(found).split(u'\n');
    QStringList lines;
    for (const QString& line : before + after)
        if (before.contains(line) != after.contains(line))
            lines += (before.contains(line) ? u"- "_s : u"+ "_s) + line;
    return '\n' + lines.join(u'\n').toStdString();
}

Snapshot::Snapshot() : files_(filesOnDisk())
{
    if (shopIsOnServer()) {
        serverShop().copy(serverShop().shop, serverShop().saved);
        return;
    }
    closeConnections();  // so that the file contains all changes
    database_ = files::readBytes(app::embeddedFile(shopName));
    EnsureConnection();
}

void Snapshot::restore() const
{
    if (shopIsOnServer()) {
        serverShop().copy(serverShop().saved, serverShop().shop);
    } else {
        closeConnections();
        for (const char* suffix : {"-wal", "-shm"})
            QFile::remove(app::embeddedFile(shopName) + QString::fromLatin1(suffix));
        files::writeBytes(app::embeddedFile(shopName), database_);
        EnsureConnection();
    }
    for (const QString& file : filesOnDisk().keys())
        QFile::remove(file);
    for (auto file = files_.begin(); file != files_.end(); ++file)
        files::writeBytes(file.key(), file.value());
    for (QString* passed : {&gsMatchedQTNNO, &gsDeletedQTNNO, &gsDeletedSubquote})
        passed->clear();
}

}  // namespace kest::test

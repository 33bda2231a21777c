#include "support/ShopDatabase.h"

#include "setup/QuoteDatabase.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "support/MariaDbServer.h"

#include <QFile>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

const auto shopName = u"WirSql"_s;  // by default, on every engine

void fill(db::Connection& database, app::Dialect dialect)
{
    app::createTables(database, dialect);
    app::fillNewShop(database);
    database.execute(
        u"INSERT INTO MODEL (MODEL_ID, MODEL_ID1, MAKE, MODEL) VALUES ('C120', 'C120', 'CORELLA', 'MERIDIAN GL')"_s);
    database.execute(
        u"INSERT INTO ALLMODEL (MODEL_ID, MAKE, MODEL, SCHEDULE) VALUES ('C120', 'CORELLA', 'MERIDIAN GL', '')"_s);
}

/// Built once, in the profile of the first test, since making tables costs commits.
const QByteArray& newShopFile()
{
    static const QByteArray file = [] {
        const db::ConnectionPtr database = app::openEmbedded(shopName);
        fill(*database, app::Dialect::Embedded);
        database->close();
        return files::readBytes(app::embeddedFile(shopName));
    }();
    return file;
}

/// The shop's database on the server, and copies of it beside it. No table is made anew, that would cost a test more
/// than all else.
class ServerShop {
public:
    ServerShop()
    {
        for (const QString& name : {shop, saved, fresh})
            mariaDb().createDatabase(name);
        connection_->open(mariaDb().connectionText(fresh));
        fill(*connection_, app::Dialect::MariaDb);
        db::Recordset names(connection_);
        names.open(u"SELECT TABLE_NAME, AUTO_INCREMENT FROM INFORMATION_SCHEMA.TABLES WHERE TABLE_SCHEMA=DATABASE()"_s);
        for (; !names.eof(); names.moveNext()) {
            const QString table = names.text(u"TABLE_NAME"_s);
            tables_[table] = !names.isNull(u"AUTO_INCREMENT"_s);
            for (const QString& name : {shop, saved})
                connection_->execute(u"CREATE TABLE %1.%2 LIKE %2"_s.arg(name, table));
        }
    }

    void copy(const QString& from, const QString& to)
    {
        for (auto table = tables_.begin(); table != tables_.end(); ++table) {
            const QString clear = table.value() ? u"TRUNCATE TABLE "_s : u"DELETE FROM "_s;  // which keeps the counter
            connection_->execute(clear + to + u'.' + table.key());
            connection_->execute(u"INSERT INTO %1.%3 SELECT * FROM %2.%3"_s.arg(to, from, table.key()));
        }
    }

    const QString shop = shopName;
    const QString saved = u"saved"_s;
    const QString fresh = u"fresh"_s;

private:
    db::ConnectionPtr connection_ = std::make_shared<db::Connection>();
    QMap<QString, bool> tables_;  // true for one that numbers its rows
};

ServerShop& serverShop()
{
    static ServerShop made;
    return made;
}

}  // namespace

bool shopIsOnServer()
{
    return qEnvironmentVariable("KEST2_TEST_ENGINE") == u"mariadb"_s;
}

void makeShopDatabase()
{
    if (!shopIsOnServer()) {
        const QByteArray& file = newShopFile();
        files::makeFolder(profile::root() + u"/databases"_s);
        files::writeBytes(app::embeddedFile(shopName), file);
        return;
    }
    serverShop().copy(serverShop().fresh, serverShop().shop);
    RegCreateSubKey(settings::Hive::LocalMachine, u"SOFTWARE\\wirra32\\frmsplash"_s);
    RegSetValue(settings::Hive::LocalMachine, u"SOFTWARE\\wirra32\\frmsplash"_s, u"ServerName"_s,
                u"mysql:127.0.0.1:%1"_s.arg(mariaDb().port()));
}

SavedShopDatabase::SavedShopDatabase()
{
    if (shopIsOnServer()) {
        serverShop().copy(serverShop().shop, serverShop().saved);
        return;
    }
    gConn->close();  // so that all of it is in the one file
    file_ = files::readBytes(app::embeddedFile(shopName));
    EnsureConnection();
}

void SavedShopDatabase::restore() const
{
    if (shopIsOnServer()) {
        serverShop().copy(serverShop().saved, serverShop().shop);
        return;
    }
    gConn->close();
    for (const char* suffix : {"-wal", "-shm"})
        QFile::remove(app::embeddedFile(shopName) + QString::fromLatin1(suffix));
    files::writeBytes(app::embeddedFile(shopName), file_);
    EnsureConnection();
}

}  // namespace kest::test

#include "setup/Profile.h"

#include "base/ModRegistry.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/files/Lock.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/settings/registry.h"
#include "setup/DemoShop.h"
#include "setup/PrepareDatabase.h"
#include "setup/QuoteDatabase.h"

#include <QDir>
#include <QFileInfo>

namespace kest::app {

using namespace Qt::StringLiterals;
using settings::Hive;

namespace {

const QString hostKey = u"SOFTWARE\\wirra32\\frmsplash"_s;
const QString systemKey = u"SOFTWARE\\Microsoft\\Windows NT\\CurrentVersion"_s;

const QString home = u"c:\\wirdoc\\"_s;
const QString images = u"c:\\wirimg\\"_s;
const QString reports = u"c:\\wirra32\\report\\"_s;
const QString databaseName = u"WirSql"_s;
const QString lockName = u"init.lock"_s;
const QString nameOfDemoShop = u"Marlin Smash Repairs"_s;

struct Setting {
    QString key;
    QString name;
    QString value;
};

const QList<Setting>& settingsOfNewProfile()
{
    static const QList<Setting> all = {
        {hostKey, u"EcomHome"_s, home},
        {hostKey, u"ImagesPath"_s, images},
        {hostKey, u"ReportPath"_s, reports},
        {hostKey, u"ServerName"_s, u"(local)"_s},
        {hostKey, u"DatabaseName"_s, databaseName},
        {hostKey, u"ClientConnectionType"_s, u"0"_s},
        {systemKey, u"CurrentVersion"_s, u"10.0"_s},
    };
    return all;
}

/// Stores a setting that is missing.
void writeSetting(const Setting& setting)
{
    const auto& [key, name, value] = setting;
    if (RegGetValue(Hive::LocalMachine, key, name).isEmpty() &&
        (!settings::createKey(Hive::LocalMachine, key) ||
         !settings::setValue(Hive::LocalMachine, key, name, {settings::Type::Text, value})))
        throw RuntimeError(FileInputOutput, u"The setting %1 can't be written."_s.arg(name));
}

/// Returns a setting of the host or, if it is missing, the value of a new profile.
QString hostSetting(const QString& name)
{
    QString ofNewProfile;
    for (const Setting& setting : settingsOfNewProfile())
        if (setting.name == name)
            ofNewProfile = setting.value;
    return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, name, ofNewProfile, CopyUp::No);
}

/// Returns true if initProfile() has begun to fill the folder, but failed before it stored a setting.
bool isUnfinished(const QDir& folder)
{
    return folder.exists(lockName) && !folder.exists(u"registry.ini"_s);
}

/// Returns the path, with a number behind it if something else has that name.
QString freeName(const QString& path)
{
    QString name = path;
    for (int number = 2; QFileInfo::exists(name); ++number)
        name = path + QString::number(number);
    return name;
}

void makeFolders()
{
    const QString messages = hostSetting(u"EcomHome"_s);
    for (const QString& folder :
         {messages + u"AUnread"_s, messages + u"ARead"_s, messages + u"AUnsent"_s, messages + u"ASent"_s,
          messages + u"PDF"_s, hostSetting(u"ImagesPath"_s), hostSetting(u"ReportPath"_s), profile::componentFolder()})
        files::makeFolder(folder);
}

void makeDatabase(Shop shop, const QDate& today)
{
    // under another name until it is complete, so that no one opens an unfinished database
    const QString unfinished = u"unfinished"_s;
    for (const QString& leftOver : files::list(profile::root() + u"/databases"_s, unfinished + u".db*"_s))
        files::remove(profile::root() + u"/databases/"_s + leftOver);
    const db::ConnectionPtr database = openEmbedded(unfinished);
    database->execute(u"BEGIN"_s);  // one write to the disk instead of hundreds
    createTables(*database, Server::Embedded);
    fillNewShop(*database);
    if (shop == Shop::Demo)
        fillDemoShop(*database, today);
    database->execute(u"COMMIT"_s);
    database->close();
    files::move(embeddedFile(unfinished), embeddedFile(databaseName));
}

void repairDatabases()
{
    const QString folder = profile::root() + u"/databases"_s;
    for (const QString& file : files::list(folder, u"*.db"_s))
        attempt([&] {  // a file may not be a quote database
            const db::ConnectionPtr database = openEmbedded(file.chopped(3));
            repairIndexes(*database);
            createParts(database, missingParts(database));
        });
}

void installTemplates()
{
    registerResources();
    const QDir templates(u":/templates"_s);
    for (const QString& name : templates.entryList(QDir::Files)) {
        QFile file(templates.filePath(name));
        file.open(QIODevice::ReadOnly);
        const QString place = hostSetting(u"ReportPath"_s) + name;
        if (!files::exists(place))  // an existing one may have been changed by the shop
            files::writeBytes(place, file.readAll());
    }
}

}  // namespace

bool isWholeProfile()
{
    return !RegGetValue(Hive::LocalMachine, systemKey, u"CurrentVersion"_s).isEmpty();
}

bool initProfile(const std::function<bool()>& registerClass, Shop shop, const QDate& today)
{
    settings::check();
    if (isWholeProfile()) {
        repairDatabases();
        return false;
    }
    files::makeFolder(profile::root());
    // a second init at the same time would delete the unfinished database
    constexpr int longestInit = 60000;  // milliseconds
    const files::Lock making(profile::root() + u'/' + lockName, {}, longestInit);
    if (!making.isHeld())
        throw RuntimeError(PermissionDenied, u"Another \"kest2 init\" is still creating "_s + profile::root());
    if (isWholeProfile())
        return false;
    makeFolders();
    files::makeFolder(profile::root() + u"/databases"_s);
    installTemplates();
    if (!files::exists(embeddedFile(databaseName)))
        makeDatabase(shop, today);
    if (shop == Shop::Demo)
        putDemoFiles(hostSetting(u"EcomHome"_s), hostSetting(u"ImagesPath"_s), today);
    if (!registerClass())
        throw RuntimeError(FileInputOutput, u"The class can't be registered in the settings."_s);
    if (shop == Shop::Demo)
        nameShop(nameOfDemoShop);
    for (const Setting& setting : settingsOfNewProfile())  // last, because they mark the profile as complete
        writeSetting(setting);
    return true;
}

void nameShop(const QString& name)
{
    if (!name.isEmpty())
        writeSetting({hostKey, u"ShopName"_s, name});
}

void placeProfile(const QString& folder)
{
    if (!QDir::isAbsolutePath(folder))
        throw RuntimeError(PathNotFound, u"a whole path is needed, from the first \"/\" on"_s);
    const QString place = profile::root();
    const QString chosen = QDir::cleanPath(folder);
    if (QFileInfo(place).isSymLink() && (chosen != place || isUnfinished(place)))
        QFile::remove(place);  // of an attempt that has failed
    const QDir there(chosen);
    const bool isEmpty = there.isEmpty(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot);
    if (there.exists() && !isEmpty && !there.exists(u"registry.ini"_s) && !isUnfinished(chosen))
        throw RuntimeError(FileExists, u"it contains other files"_s);
    if (chosen == place)
        return;
    files::makeFolder(chosen);
    const QString settings = u"/registry.ini"_s;
    const bool hasHostSettings = QFile::exists(place + settings) && !isWholeProfile();
    if (hasHostSettings)
        QFile::rename(place + settings, chosen + settings);  // which fails if the folder has its own
    QDir().rmdir(place);                                     // which fails if anything is in it
    if (isUnfinished(place) || (hasHostSettings && QFileInfo::exists(place)))
        QDir().rename(place, freeName(place + u".unfinished"_s));
    files::makeFolder(QFileInfo(place).path());
    if (!QFile::link(chosen, place))
        throw RuntimeError(PermissionDenied, u"%1 can't become a link to it"_s.arg(place));
}

QJsonObject where()
{
    const QString messages = hostSetting(u"EcomHome"_s);
    readConnectionSettings();
    const QString embedded = db::embeddedName(connectionText(driverNumber(CopyUp::No)));
    const QString database = embedded.isEmpty() ? gsServer + u'/' + gsDatabase : embeddedFile(embedded);
    const auto folder = [](const QString& path) { return QDir::cleanPath(files::systemPath(path)); };
    return {
        {u"profile"_s, profile::root()},
        {u"database"_s, database},
        {u"unread"_s, folder(messages + u"AUnread"_s)},
        {u"read"_s, folder(messages + u"ARead"_s)},
        {u"unsent"_s, folder(messages + u"AUnsent"_s)},
        {u"sent"_s, folder(messages + u"ASent"_s)},
        {u"images"_s, folder(hostSetting(u"ImagesPath"_s))},
        {u"pdf"_s, folder(messages + u"PDF"_s)},
        {u"reports"_s, folder(hostSetting(u"ReportPath"_s))},
        {u"log"_s, QDir::cleanPath(files::systemPath(errorLogPath()))},
        {u"component"_s, profile::componentFolder()},
    };
}

}  // namespace kest::app

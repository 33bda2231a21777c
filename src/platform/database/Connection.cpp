#include "platform/database/Connection.h"

#include "platform/RuntimeError.h"
#include "platform/database/Session.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QDir>
#include <QFile>
#include <QHash>
#include <QSysInfo>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

/// Returns the fields of a connection text with their names in lower case. A value in braces may contain ";".
QHash<QString, QString> fieldsOf(const QString& text)
{
    QHash<QString, QString> fields;
    for (qsizetype i = 0; i < text.size();) {
        const qsizetype equals = text.indexOf(u'=', i);
        if (equals < 0)
            break;
        const QString name = text.sliced(i, equals - i).trimmed().toLower();
        const bool braced = equals + 1 < text.size() && text[equals + 1] == u'{';
        const qsizetype close = braced ? text.indexOf(u'}', equals) : -1;
        const qsizetype end = text.indexOf(u';', close < 0 ? equals : close);
        const qsizetype stop = end < 0 ? text.size() : end;
        const QString value =
            close < 0 ? text.sliced(equals + 1, stop - equals - 1) : text.sliced(equals + 2, close - equals - 2);
        if (!fields.contains(name))
            fields.insert(name, value.trimmed());
        i = stop + 1;
    }
    return fields;
}

QString fieldOf(const QHash<QString, QString>& fields, const QString& name, const QString& otherName)
{
    return fields.contains(name) ? fields.value(name) : fields.value(otherName);
}

/// Returns true if the driver is in the list of drivers of this process, this user or this machine.
bool isRegistered(const QString& driver)
{
    const QString folder = qEnvironmentVariable("ODBCSYSINI", u"/etc"_s);
    QString systemList = qEnvironmentVariable("ODBCINSTINI", u"odbcinst.ini"_s);
    if (QDir::isRelativePath(systemList))
        systemList = folder + u'/' + systemList;
    for (const QString& path : {systemList, QDir::homePath() + u"/.odbcinst.ini"_s}) {
        QFile list(path);
        if (!list.open(QIODevice::ReadOnly))
            continue;
        for (const QByteArray& line : list.readAll().split('\n')) {
            const QString section = QString::fromUtf8(line).trimmed();
            if (section.startsWith(u'[') && section.endsWith(u']') &&
                section.sliced(1, section.size() - 2).trimmed().compare(driver, Qt::CaseInsensitive) == 0)
                return true;
        }
    }
    return false;
}

bool isMySql(const QString& driver)
{
    return driver.contains(u"mysql"_s, Qt::CaseInsensitive) || driver.contains(u"mariadb"_s, Qt::CaseInsensitive);
}

/// Returns true if the name of a server means this machine.
bool isThisMachine(const QString& server)
{
    const QString machine = QSysInfo::machineHostName();
    for (const QString& name : {u"(local)"_s, u"."_s, u"localhost"_s, machine, machine.section(u'.', 0, 0)}) {
        if (!name.isEmpty() && server.compare(name, Qt::CaseInsensitive) == 0)
            return true;
    }
    return false;
}

std::unique_ptr<Engine> openLocal(const QString& name)
{
    if (!files::isPlainName(name))
        throw RuntimeError(CannotOpen, u"\""_s + name + u"\" is not the name of a database."_s);
    return openEmbedded(files::systemPath(profile::root() + u"/databases/"_s + name + u".db"_s));
}

std::unique_ptr<Engine> openEngine(const QString& text)
{
    const QHash<QString, QString> fields = fieldsOf(text);
    const QString driver = fields.value(u"driver"_s);
    const QString server = fields.value(u"server"_s);
    const QString databaseName = fields.value(u"database"_s);
    if (isMySql(driver)) {
        return openMySql(server, fields.value(u"port"_s).toInt(), databaseName, fieldOf(fields, u"uid"_s, u"user"_s),
                         fieldOf(fields, u"pwd"_s, u"password"_s));
    }
    if (!driver.isEmpty() && isRegistered(driver))
        return openOdbc(text);
    if (const QString name = embeddedName(text); !name.isEmpty())
        return openLocal(name);
    throw RuntimeError(CannotOpen, u"No driver on this machine reaches the server \""_s + server + u'"')
        .withDatabaseCodes(u"0"_s, u"IM002"_s);
}

}  // namespace

QString embeddedName(const QString& connectionText)
{
    const QHash<QString, QString> fields = fieldsOf(connectionText);
    const QString driver = fields.value(u"driver"_s);
    const QString server = fields.value(u"server"_s);
    if (driver.isEmpty() || isMySql(driver) || isRegistered(driver) || !isThisMachine(server.section(u'\\', 0, 0)))
        return {};
    const QString instance = server.section(u'\\', 1);
    const QString database = fields.value(u"database"_s);
    return instance.isEmpty() ? database : instance + u'.' + database;
}

Connection::Connection() = default;
Connection::~Connection() = default;

void Connection::open(const QString& connectionText)
{
    close();
    session_ = std::make_unique<Session>(openEngine(connectionText));
    session_->engine().setTimeout(commandTimeout_);
}

void Connection::close()
{
    session_.reset();
}

int Connection::state() const
{
    return session_ && session_->engine().isOpen() ? 1 : 0;
}

bool Connection::answers() const
{
    if (state() == 1)
        attempt([&] { session_->engine().ping(); });
    return state() == 1;
}

void Connection::setCommandTimeout(int seconds)
{
    commandTimeout_ = seconds;
    if (state() == 1)
        session_->engine().setTimeout(seconds);
}

qint64 Connection::execute(const QString& statement)
{
    return session().execute(statement);
}

void Connection::rebuildIndexes()
{
    session().engine().rebuildIndexes();
}

Lock::Lock(ConnectionPtr connection, const QString& name, int seconds) : connection_(std::move(connection)), name_(name)
{
    if (!connection_)
        throw RuntimeError(CannotOpen, u"There is no connection to the database."_s);
    held_ = connection_->session().engine().lock(name_, seconds);
}

Lock::~Lock()
{
    if (held_ && connection_->state() == 1)  // a closed connection has lost the lock
        attempt([&] { connection_->session().engine().unlock(name_); });
}

Session& Connection::session() const
{
    if (state() != 1)
        throw RuntimeError(CannotOpen, u"The connection to the database is closed."_s);
    return *session_;
}

}  // namespace kest::db

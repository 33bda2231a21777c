#include "platform/database/Connection.h"

#include "platform/RuntimeError.h"
#include "platform/Waiting.h"
#include "platform/database/Change.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/ConnectionText.h"
#include "platform/database/FaultInjection.h"
#include "platform/database/OdbcDrivers.h"
#include "platform/database/Session.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QSysInfo>
#include <QThread>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

std::function<bool()> connectionFault;

void failOnRequest()
{
    if (connectionFault && connectionFault())
        throw RuntimeError(CannotOpen, u"A fault set by a test."_s);
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

std::unique_ptr<Engine> openServer(const QString& connectionText, const ConnectionText& odbcOptions,
                                   int statementSeconds)
{
    const ConnectionText text(connectionText);
    const QString driver = text.value(u"Driver");
    if (isMySql(driver)) {
        const MySqlAddress address{text.value(u"Server"), text.value(u"Port").toInt(), text.value(u"Database"),
                                   text.value(u"Uid", u"User"), text.value(u"Pwd", u"Password")};
        return openMySql(address, statementSeconds);
    }
    if (isRegistered(driver))
        return openOdbc(odbcTarget(text, driver, odbcOptions));
    const QString other = driver.contains(u"SQL"_s, Qt::CaseInsensitive) ? sqlServerDriver() : QString();
    if (other.isEmpty())
        throw RuntimeError(CannotOpen,
                           u"No driver on this machine reaches the server \""_s + text.value(u"Server") + u'"')
            .withDatabaseCodes(u"0"_s, u"IM002"_s);
    return openOdbc(odbcTarget(text, other, odbcOptions));
}

}  // namespace

QString embeddedName(const QString& connectionText)
{
    const ConnectionText text(connectionText);
    const QString driver = text.value(u"Driver");
    const QString server = text.value(u"Server");
    if (driver.isEmpty() || isMySql(driver) || isRegistered(driver) || !isThisMachine(server.section(u'\\', 0, 0)))
        return {};
    const QString instance = server.section(u'\\', 1);
    const QString database = text.value(u"Database");
    return instance.isEmpty() ? database : instance + u'.' + database;
}

void setConnectionFault(std::function<bool()> fault)
{
    connectionFault = std::move(fault);
}

Connection::Connection()
{
    close();
}
Connection::~Connection() = default;

void Connection::open(const QString& connectionText)
{
    close();
    failOnRequest();
    std::unique_ptr<Engine> engine;
    if (const QString name = embeddedName(connectionText); !name.isEmpty()) {
        engine = openLocal(name);
    } else {
        patiently(u"Connecting to "_s + ConnectionText(connectionText).value(u"Server") + u"..."_s,
                  [&, here = QThread::currentThread()] {
                      engine = openServer(connectionText, ConnectionText(odbcOptions_), commandTimeout_);
                      engine->moveTo(here);
                  });
    }
    session_ = std::make_unique<Session>(std::move(engine));
    session_->engine().setTimeout(commandTimeout_);
    ++generation_;
}

void Connection::close(const QString& reason)
{
    whyClosed_ = reason;
    session_.reset();
}

int Connection::state() const
{
    return session_ && session_->engine().isOpen() ? 1 : 0;
}

bool Connection::answers() const
{
    if (state() == 1 && !attempt([&] {
            failOnRequest();
            session_->engine().ping();
        }))
        session_->engine().drop();  // whatever the reason
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
    if (observer_ && !inChange_) {
        const std::optional<PastedChange> pasted = pastedChange(statement);
        if (pasted && observerOf(pasted->table))
            return executeObserved(*this, *pasted, statement);
        if (!pasted && changesRows(statement) && observerOf({}))
            throw RuntimeError(StatementFailed, u"What this statement changes can't be recorded: "_s + statement);
    }
    return session().execute(statement);
}

QStringList Connection::tablesWithoutTransactions(const QStringList& tables) const
{
    QStringList names;
    const Dialect& dialect = session().dialect();
    if (dialect.withoutTransactions.isEmpty())
        return names;
    QStringList literals;
    for (const QString& table : tables)
        literals.append(dialect.literal(table.toUpper()));
    const QString question = dialect.withoutTransactions.arg(literals.join(u", "_s));
    for (const QVariant& name : session().engine().run(question).values)
        names.append(normalised(name, Kind::Text).toString());
    return names;
}

void Connection::endSession(const QString& serverSession, const QString& lock) const
{
    session().engine().endSession(serverSession, lock);
}

QString Connection::serverSession() const
{
    const QString question = session().dialect().sessionNumber;
    return question.isEmpty() ? QString() : session().engine().run(question).values.front().toString();
}

bool Connection::hasTable(const QString& name) const
{
    return session().table(name) != nullptr;
}

ChangeObserver* Connection::observerOf(const QString& table) const
{
    return observer_ && !inChange_ && observer_->observes(table) ? observer_.get() : nullptr;
}

void Connection::rebuildIndexes()
{
    session().engine().rebuildIndexes();
}

Lock::Lock(ConnectionPtr connection, const QString& name, int seconds) : connection_(std::move(connection)), name_(name)
{
    if (!connection_)
        throw RuntimeError(CannotOpen, u"There is no connection to the database."_s);
    Session& session = connection_->session();
    patiently(u"Waiting for the database..."_s, [&] { held_ = session.engine().lock(name_, seconds); });
}

Lock::~Lock()
{
    if (held_ && connection_->state() == 1)  // a closed connection has lost the lock
        attempt([&] { connection_->session().engine().unlock(name_); });
}

Session& Connection::session() const
{
    if (state() != 1)
        throw RuntimeError(CannotOpen, whyClosed_);
    return *session_;
}

}  // namespace kest::db

#include "app/Commands.h"

#include "app/DatabaseCommand.h"
#include "app/HistoryCommands.h"
#include "app/MessageCommands.h"
#include "app/Outcome.h"
#include "app/ProfileWindow.h"
#include "app/TransportCommand.h"
#include "base/CredentialCipher.h"
#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "jobexport/JobLinkSettings.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/Person.h"
#include "platform/desktop/Window.h"
#include "platform/files/Background.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/print/OutputFolder.h"
#include "platform/profile.h"
#include "platform/script/Script.h"
#include "platform/settings/registry.h"
#include "recovery/Recovery.h"
#include "setup/Profile.h"
#include "shell/component.h"
#include "shell/eKEST.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QJsonDocument>
#include <QRegularExpression>
#include <QScopeGuard>

#include <cstdio>
#include <functional>
#include <map>
#include <optional>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr int backgroundWait = 30'000;  // milliseconds

enum class Needs { Nothing, Profile, Connection };

struct Command {
    Needs needs;
    int fewest;  // the smallest number of arguments
    int most;
    std::function<Outcome(const CommandLine& line)> run;
};

/// Wraps a command that needs only its arguments.
std::function<Outcome(const CommandLine&)> with(Outcome (*run)(const QStringList& arguments))
{
    return [run](const CommandLine& line) { return run(line.arguments); };
}

/// Returns true if `database` is the file of an embedded database and does not exist. Servers have no such path.
bool isMissing(const QString& database)
{
    return QDir::isAbsolutePath(database) && !QFile::exists(database);
}

Outcome init(const QStringList& arguments)
{
    const bool demo = arguments.contains(u"--demo"_s);
    if (arguments.size() > (demo ? 1 : 0))
        return refused(u"init takes --demo and nothing else"_s, Usage);
    if (!initProfile(registerClass, demo ? Shop::Demo : Shop::New)) {
        if (const QString database = where()[u"database"_s].toString(); isMissing(database))
            return refused(u"the profile exists, but its database does not: "_s + database, Refused);
        return {.text = u"The profile already exists: "_s + profile::root() + u'\n'};
    }
    if (demo)
        installTransport(QCoreApplication::applicationFilePath());
    return {.text = u"The profile is ready: "_s + profile::root() + u'\n'};
}

Outcome showWhere(const QStringList&)
{
    settings::check();
    const QJsonObject places = where();
    return {.fields = places, .text = QString::fromUtf8(QJsonDocument(places).toJson()), .isWhole = true};
}

/// Goes through the class object, as the host does.
Outcome open(const QStringList& arguments)
{
    void* object = nullptr;
    if (DllGetClassObject(CLSID_eKEST, com::IID_IClassFactory, &object) != com::Ok)
        return refused(u"the class object could not be created"_s, Refused);
    auto* factory = static_cast<com::IClassFactory*>(object);
    const com::HResult created = factory->CreateInstance(nullptr, IID_IeKEST, &object);
    factory->Release();
    if (created != com::Ok)
        return refused(u"the component could not be created"_s, Refused);

    auto* component = static_cast<IeKEST*>(object);
    std::u16string quote = arguments.value(0, u"0"_s).toStdU16String();
    std::u16string subquote = arguments.value(1, u"0"_s).toStdU16String();
    Text quoteText = quote.data();
    Text subquoteText = subquote.data();
    component->ShowKESTWindow(&quoteText, &subquoteText);
    const bool connected = gConn && gConn->state() == 1;
    component->Release();
    desktop::throwKept();
    return {.exitCode = connected ? Done : NoConnection};
}

bool isPassword(const QString& setting)
{
    return setting.endsWith(u"Pwd"_s, Qt::CaseInsensitive);
}

/// Whether a setting is a password or contains one, as options of a driver can.
bool isSecret(const QString& setting, const QString& value)
{
    static const QRegularExpression password(u"\\b(pwd|password)\\s*="_s, QRegularExpression::CaseInsensitiveOption);
    return isPassword(setting) || (setting.endsWith(u"OdbcOptions"_s, Qt::CaseInsensitive) && value.contains(password));
}

QJsonArray settingsAsJson()
{
    QJsonArray all;
    for (const settings::Entry& entry : settings::entries()) {
        static const std::map<settings::Hive, QString> hives{{settings::Hive::ClassesRoot, u"HKEY_CLASSES_ROOT"_s},
                                                             {settings::Hive::CurrentUser, u"HKEY_CURRENT_USER"_s},
                                                             {settings::Hive::LocalMachine, u"HKEY_LOCAL_MACHINE"_s}};
        all.append(
            QJsonObject{{u"hive"_s, hives.at(entry.hive)},
                        {u"key"_s, entry.key},
                        {u"name"_s, entry.name},
                        {u"value"_s, isSecret(entry.name, entry.value.data) ? u"(not shown)"_s : entry.value.data}});
    }
    return all;
}

/// Reads a password from standard input, so that it appears neither in the list of processes nor in a shell's history.
/// Returns nothing if a connection text can't contain it.
std::optional<QString> passwordFromInput()
{
    QFile input;
    if (!input.open(stdin, QIODevice::ReadOnly))
        return {};
    QString password = QString::fromLocal8Bit(input.readLine());
    while (password.endsWith(u'\n') || password.endsWith(u'\r'))
        password.chop(1);
    // a driver takes a leading "{" as the beginning of a quoted value
    if (password.contains(u';') || password.startsWith(u'{') || password.trimmed() != password ||
        files::fromCodePage(files::toCodePage(password)) != password)
        return {};
    return password;
}

Outcome badPassword()
{
    return refused(
        u"the password is read from standard input, and must not contain \";\", begin with \"{\", have blanks at its "
        u"ends or "
        "contain characters outside of code page 1252"_s,
        Refused);
}

Outcome setSetting(const QString& key, const QString& name, const QString& value)
{
    RegCreateSubKey(settings::Hive::LocalMachine, key);
    if (!RegSetValue(settings::Hive::LocalMachine, key, name, value))
        return refused(u"the setting could not be written. "_s + settings::changeFailure(), Refused);
    if (isPassword(name))
        return {};
    return {.fields = {{u"value"_s, RegGetValue(settings::Hive::LocalMachine, key, name)}}};
}

Outcome setting(const QStringList& arguments)
{
    const QString& what = arguments[0];
    if (what == u"list"_s && arguments.size() == 1) {
        const QJsonArray all = settingsAsJson();
        QString text;
        for (const QJsonValue entry : all)
            text += entry[u"hive"].toString() + u'\\' + entry[u"key"].toString() + u'\t' + entry[u"name"].toString() +
                    u'\t' + entry[u"value"].toString() + u'\n';
        return {.fields = {{u"settings"_s, all}}, .text = text};
    }
    const auto wrong = [] {
        return refused(
            u"setting takes list, get APP SECTION KEY or set APP SECTION KEY VALUE; a password has no VALUE, "
            "it is read from standard input"_s,
            Usage);
    };
    if (arguments.size() < 4)
        return wrong();

    const QString key = u"SOFTWARE\\"_s + arguments[1] + u'\\' + arguments[2];
    const QString& name = arguments[3];
    if (what == u"get"_s && arguments.size() == 4) {
        const QString value = RegGetValue(settings::Hive::LocalMachine, key, name);
        if (isSecret(name, value))
            return refused(u"a password is not shown"_s, Refused);
        return {.fields = {{u"value"_s, value}}, .text = value + u'\n'};
    }
    if (what != u"set"_s || arguments.size() != (isPassword(name) ? 4 : 5))
        return wrong();
    if (!isPassword(name) && isSecret(name, arguments[4]))
        return refused(u"options must not contain a password: set SAPwd or TabletMasterSAPwd"_s, Refused);
    if (!isPassword(name))
        return setSetting(key, name, arguments[4]);
    const std::optional<QString> password = passwordFromInput();
    return password ? setSetting(key, name, *password) : badPassword();
}

/// `joblink set --server S --port N --database D --user U`, with the password from standard input.
Outcome jobLink(const QStringList& arguments)
{
    const auto wrong = [] { return refused(u"joblink set takes --server S --port N --database D --user U"_s, Usage); };
    if (arguments[0] != u"set"_s || arguments.size() != 9)
        return wrong();
    std::map<QString, QString> options;
    for (qsizetype i = 1; i < arguments.size(); i += 2)
        options[arguments[i]] = arguments[i + 1];
    bool isPort = false;
    JobLinkSettings settings{.server = options[u"--server"_s],
                             .port = options[u"--port"_s].toUShort(&isPort),
                             .database = options[u"--database"_s],
                             .user = options[u"--user"_s],
                             .password = {}};
    if (!isPort || settings.server.isEmpty() || settings.database.isEmpty() || settings.user.isEmpty())
        return wrong();

    const std::optional<QString> password = passwordFromInput();
    if (!password)
        return badPassword();
    settings.password = *password;
    storeJobLinkSettings(settings);
    return {.text = u"JobLink's settings are stored.\n"_s};
}

Outcome transport(const CommandLine& line)
{
    static const std::map<QString, TransportMode> modes{
        {{}, TransportMode::Watching}, {u"--once"_s, TransportMode::Once}, {u"--window"_s, TransportMode::Window}};
    const auto mode = modes.find(line.arguments.value(0));
    if (mode == modes.end())
        return refused(u"transport takes --once or --window and nothing else"_s, Usage);

    QJsonArray carried;
    bool faulty = false;
    const bool ran = runTransport(mode->second, [&](const Carry& carry) {
        for (const Carried& file : carry.carried) {
            const QString direction = file.direction == Carried::Direction::Out ? u"out"_s : u"in"_s;
            if (line.json)
                carried.append(
                    QJsonObject{{u"direction"_s, direction}, {u"file"_s, file.file}, {u"what"_s, file.what}});
            else
                say(direction + u'\t' + file.file + u'\t' + file.what + u'\n');
        }
        for (const QString& fault : carry.faults)
            say(u"kest2: "_s + fault + u'\n', stderr);
        faulty = !carry.faults.isEmpty();
    });
    if (!ran)
        return refused(u"another transport is already running for this profile"_s, Refused);
    return {.exitCode = faulty && mode->second == TransportMode::Once ? Refused : Done,
            .fields = {{u"carried"_s, carried}}};
}

const std::map<QString, Command> commands{
    {u"init"_s, {Needs::Nothing, 0, 1, with(init)}},
    {u"where"_s, {Needs::Nothing, 0, 0, with(showWhere)}},
    {u"open"_s, {Needs::Profile, 0, 2, with(open)}},
    {u"list"_s, {Needs::Connection, 1, 3, with(list)}},
    {u"load"_s, {Needs::Connection, 1, 1, with(load)}},
    {u"send"_s, {Needs::Connection, 1, 2, with(send)}},
    {u"reprint"_s, {Needs::Connection, 1, 1, with(reprint)}},
    {u"view"_s, {Needs::Connection, 2, 2, with(view)}},
    {u"setting"_s, {Needs::Profile, 1, 5, with(setting)}},
    {u"joblink"_s, {Needs::Connection, 1, 9, with(jobLink)}},
    {u"history"_s, {Needs::Connection, 1, 2, with(history)}},
    {u"undo"_s, {Needs::Connection, 1, 1, with(undo)}},
    {u"held"_s, {Needs::Connection, 0, 0, with(held)}},
    {u"transport"_s, {Needs::Profile, 0, 1, transport}},
    {u"check-database"_s, {Needs::Connection, 0, 1, with(checkDatabase)}},
};

bool showsTransport(const CommandLine& line)
{
    return line.command == u"transport"_s && line.arguments.contains(u"--window"_s);
}

bool hasProfile()
{
    return QFileInfo::exists(profile::root() + u"/registry.ini"_s);
}

/// Returns true if there is a shop. A host that has started before there was one has only written its settings.
bool hasShop()
{
    bool isMissing = !hasProfile();
    if (!isMissing)
        attempt([&] {  // damaged settings are told later
            settings::check();
            isMissing = usesEmbeddedDatabase() && !isWholeProfile();
        });
    return !isMissing;
}

/// Returns why there is no usable profile, or an empty text if there is one.
QString profileFault()
{
    if (!hasProfile())
        return u"no profile at "_s + profile::root() + u"; create one with: kest2 init"_s;
    try {
        settings::check();
    } catch (const RuntimeError& error) {
        return error.description();
    }
    return {};
}

Outcome runConnected(const Command& command, const CommandLine& line)
{
    const eKEST component;
    if (!hasConnection())
        return {.exitCode = NoConnection};
    InitCipherKey();  // as the panel does, because a load may export to JobLink
    recovery::settle();
    return command.run(line);
}

Outcome runChecked(const CommandLine& line)
{
    const auto found = commands.find(line.command);
    if (found == commands.end())
        return refused(u"unknown command "_s + line.command, Usage);
    const Command& command = found->second;
    if (line.arguments.size() < command.fewest || line.arguments.size() > command.most)
        return refused(u"wrong number of arguments for "_s + line.command, Usage);
    if (command.needs != Needs::Nothing && isInteractive(line) && !hasShop()) {
        ProfileWindow::ShowForm();  // the program may have been started from the menu
        if (!hasShop())
            return refused(u"no profile was created"_s, NoConnection);
    }
    if (const QString why = command.needs == Needs::Nothing ? QString() : profileFault(); !why.isEmpty()) {
        if (isInteractive(line))
            desktop::msgBox(why, desktop::Icon::Critical);  // a program started from the menu has no visible output
        return refused(why, NoConnection);
    }
    if (command.needs == Needs::Connection)
        return runConnected(command, line);
    return command.run(line);
}

Outcome runCaught(const CommandLine& line)
{
    try {
        return runChecked(line);
    } catch (const desktop::NeedsAnswer& needed) {
        return refused(needed.reason(), NeedsAPerson);
    } catch (const RuntimeError& error) {
        return refused(error.description(), Refused);
    }
}

/// Runs the command, and tells which interrupted operations it has settled.
Outcome runTelling(const CommandLine& line)
{
    QList<recovery::Settled> settled;
    recovery::setReporter([&](const recovery::Settled& operation) {
        say(u"kest2: "_s + operation.sentence() + u'\n', stderr);
        settled.append(operation);
    });
    const auto end = qScopeGuard([] { recovery::setReporter({}); });
    Outcome outcome = runCaught(line);
    if (!settled.isEmpty())
        outcome.fields[u"recovered"_s] = jsonOf(settled);
    return outcome;
}

QJsonObject scriptIn(const QString& file)
{
    if (file.isEmpty())
        return {};
    QFile script(file);
    if (!script.open(QIODevice::ReadOnly))
        throw RuntimeError(FileNotFound, u"the script "_s + file + u" can't be read: "_s + script.errorString());
    QJsonParseError problem;
    const QJsonDocument document = QJsonDocument::fromJson(script.readAll(), &problem);
    if (!document.isObject())
        throw RuntimeError(TypeMismatch, u"the script "_s + file + u" is not a JSON object"_s +
                                             (problem.error ? u": "_s + problem.errorString() : QString()));
    return document.object();
}

std::shared_ptr<desktop::Script> answeringScript(const CommandLine& line)
{
    auto script = std::make_shared<desktop::Script>(scriptIn(line.script));
    for (const QString& window : {u"frmPrintPreview"_s, u"frmSubletAuth"_s, u"frmViewPDF"_s})
        script->recordAndClose(window);
    desktop::setAnswerer(script);
    desktop::setWindowDriver(script);
    return script;
}

void print(const CommandLine& line, const Outcome& outcome, const desktop::Record& record)
{
    if (!line.json) {
        say(outcome.text);
        return;
    }
    QJsonObject answer = outcome.fields;
    if (!outcome.isWhole) {
        answer[u"command"_s] = line.command;
        answer[u"result"_s] = outcome.exitCode == Done;
        answer[u"boxes"_s] = record.boxes;
        answer[u"inputs"_s] = record.inputs;
        answer[u"windows"_s] = record.windows;
        answer[u"reads"_s] = record.reads;
        if (!answer.contains(u"rows"_s))
            answer[u"rows"_s] = QJsonArray();
    }
    say(QString::fromUtf8(QJsonDocument(answer).toJson()));
}

}  // namespace

bool isInteractive(const CommandLine& line)
{
    return (line.command == u"open"_s || showsTransport(line)) && line.script.isEmpty();
}

bool withoutWindow(CommandLine& line)
{
    return showsTransport(line) && line.arguments.removeAll(u"--window"_s) > 0;
}

int refuse(const CommandLine& line, const QString& why, int exitCode)
{
    print(line, refused(why, exitCode), {});
    return exitCode;
}

int run(const CommandLine& line)
{
    if (!line.profile.isEmpty())
        profile::setRoot(line.profile);

    std::shared_ptr<desktop::Script> script;
    try {
        if (isInteractive(line))
            desktop::usePerson();
        else
            script = answeringScript(line);
        desktop::showWaits();
        desktop::setAbout(aboutText);
        report::setOutputFolder(line.reports);
    } catch (const RuntimeError& error) {
        return refuse(line, error.description(), Usage);
    }

    const Outcome outcome = runTelling(line);
    files::waitForBackground(backgroundWait);
    print(line, outcome, script ? script->record() : desktop::Record());
    return outcome.exitCode;
}

}  // namespace kest::app

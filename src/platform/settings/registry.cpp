#include "platform/settings/registry.h"

#include "platform/RuntimeError.h"
#include "platform/files/Lock.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/settings/RegistryFile.h"

#include <QFile>

#include <sys/stat.h>

#include <functional>
#include <mutex>
#include <tuple>

using namespace Qt::StringLiterals;

namespace kest::settings {

namespace {

constexpr std::pair<Hive, QLatin1StringView> hiveNames[] = {
    {Hive::ClassesRoot, "HKEY_CLASSES_ROOT"_L1},
    {Hive::CurrentUser, "HKEY_CURRENT_USER"_L1},
    {Hive::LocalMachine, "HKEY_LOCAL_MACHINE"_L1},
};

QString registryPath()
{
    return profile::root() + u"/registry.ini"_s;
}

QLatin1StringView nameOf(Hive hive)
{
    for (const auto& [known, name] : hiveNames) {
        if (known == hive)
            return name;
    }
    Q_UNREACHABLE();
}

/// Returns the path of the key with its hive, without surplus backslashes.
QString pathOf(Hive hive, const QString& key)
{
    QString path = nameOf(hive);
    for (const QString& name : key.split(u'\\', Qt::SkipEmptyParts))
        path += u'\\' + name;
    return path;
}

QString userKey(const QString& application, const QString& section)
{
    return u"Software\\ApplicationSettings\\"_s + application + u'\\' + section;
}

/// Identifies a state of the file: each change creates a new file.
using Identity = std::tuple<QString, quint64, qint64, qint64, qint64>;

std::optional<Identity> identityOf(const QString& path)
{
    struct stat state {};
    if (::stat(QFile::encodeName(path).constData(), &state) != 0)
        return {};
    return Identity{path, state.st_ino, state.st_size, state.st_mtim.tv_sec, state.st_mtim.tv_nsec};
}

struct Cache {
    std::mutex mutex;
    std::optional<Identity> identity;
    RegistryFile content;
};

Cache& cache()
{
    static Cache instance;
    return instance;
}

/// Reads the file. A missing file is empty. Throws RuntimeError if it can't be read or is not a settings file.
RegistryFile present()
{
    const QString path = registryPath();
    const std::optional<Identity> identity = identityOf(path);
    if (!identity)
        return {};
    Cache& kept = cache();
    const std::lock_guard lock(kept.mutex);
    if (kept.identity != identity) {
        const QByteArray bytes = files::readBytes(path);
        if (!RegistryFile::isOne(bytes))
            throw RuntimeError(FileInputOutput,
                               u"The settings file %1 is empty or damaged. Put a copy of it back, or "
                               "delete it and run \"kest2 init\"."_s.arg(path));
        kept.content = RegistryFile::fromBytes(bytes);
        kept.identity = identity;
    }
    return kept.content;
}

/// Reads the file, or returns an empty content if it can't be read.
RegistryFile readable()
{
    RegistryFile content;
    attempt([&] { content = present(); });
    return content;
}

QString whyUnchanged;

/// Reads, edits and replaces the file under a lock. Returns false if `edit` does, or if the file can't be written.
bool change(const std::function<bool(RegistryFile&)>& edit)
{
    constexpr int longestWait = 10000;  // milliseconds
    const QString path = registryPath();
    bool done = false;
    whyUnchanged.clear();
    const bool written = attempt([&] {
        try {
            const files::Lock lock(path + u".lock"_s, {}, longestWait);
            if (!lock.isHeld())
                throw RuntimeError(PermissionDenied, u"Another process is writing the settings."_s);
            RegistryFile content = present();
            done = edit(content);
            if (done)
                files::writeBytes(path, content.toBytes(), files::Access::OwnerAlone);
        } catch (const RuntimeError& error) {
            whyUnchanged = error.description();
            throw;
        }
    });
    return written && done;
}

}  // namespace

QString changeFailure()
{
    return whyUnchanged;
}

void check()
{
    present();
    attempt([] { files::restrictToOwner(registryPath()); });  // the file may be missing or belong to someone else
}

bool keyExists(Hive hive, const QString& key)
{
    return readable().find(pathOf(hive, key)) != nullptr;
}

std::optional<Value> query(Hive hive, const QString& key, const QString& name)
{
    const RegistryFile content = readable();
    const Value* const value = content.find(pathOf(hive, key), name);
    return value ? std::optional(*value) : std::nullopt;
}

bool setValue(Hive hive, const QString& key, const QString& name, const Value& value)
{
    const QString path = pathOf(hive, key);
    return change([&](RegistryFile& content) {
        if (!content.find(path))
            return false;
        content.set(path, name, value);
        return true;
    });
}

bool createKey(Hive hive, const QString& key)
{
    return change([path = pathOf(hive, key)](RegistryFile& content) {
        content.make(path);
        return true;
    });
}

bool removeKey(Hive hive, const QString& key)
{
    const QString path = pathOf(hive, key);
    return change([&](RegistryFile& content) {
        if (!content.find(path) || content.hasSubkeys(path))
            return false;
        content.remove(path);
        return true;
    });
}

QList<Entry> entries()
{
    QList<Entry> all;
    const RegistryFile content = readable();
    for (const RegistryFile::Key& key : content.keys()) {
        const QString hiveName = key.path.section(u'\\', 0, 0);
        for (const auto& [hive, name] : hiveNames) {
            if (hiveName.compare(name, Qt::CaseInsensitive) != 0)
                continue;
            for (const RegistryFile::Value& value : key.values)
                all.append({hive, key.path.section(u'\\', 1), value.name, value.value});
        }
    }
    return all;
}

QString userSetting(const QString& application, const QString& section, const QString& name, const QString& fallback)
{
    const auto value = query(Hive::CurrentUser, userKey(application, section), name);
    return value ? value->data : fallback;
}

}  // namespace kest::settings

// The registry: hives, keys and typed values in the one file registry.ini of the profile.
#pragma once

#include <QString>
#include <QStringList>

#include <optional>

namespace kest::settings {

// Keys are paths joined by backslashes; names are found without regard to case and keep the spelling they were made
// with. Each change is one atomic replacement of the file under a lock, so that two processes can write at once.

/// Throws if the file is there but can't be read or is no settings file; such a file is never written over. Takes from
/// others the right to read it, since it holds the database's password. A missing file holds nothing.
void check();

enum class Hive { ClassesRoot, CurrentUser, LocalMachine };
enum class Type { Text = 1, Binary = 3, Number = 4 };

struct Value {
    Type type = Type::Text;
    QString data;  // a Number is its decimal text

    bool operator==(const Value&) const = default;
};

struct Entry {
    Hive hive = Hive::LocalMachine;
    QString key;
    QString name;
    Value value;
};

bool keyExists(Hive hive, const QString& key);
/// The value, or none where key or value is missing. An empty name is the key's default value.
std::optional<Value> query(Hive hive, const QString& key, const QString& name);
/// False when the key does not exist or the file cannot be written.
bool setValue(Hive hive, const QString& key, const QString& name, const Value& value);
/// Makes the key and those above it. False when the file cannot be written.
bool createKey(Hive hive, const QString& key);
/// Removes a key without subkeys, with its values. False when it is missing, has subkeys or cannot be removed.
bool removeKey(Hive hive, const QString& key);
QList<Entry> entries();

/// The per-user settings area of applications: the value, or the default where there is none.
QString userSetting(const QString& application, const QString& section, const QString& name, const QString& fallback);
bool setUserSetting(const QString& application, const QString& section, const QString& name, const QString& value);

}  // namespace kest::settings

// The registry: hives, keys and typed values, stored in the file registry.ini of the profile.
#pragma once

#include <QString>
#include <QStringList>

#include <optional>

namespace kest::settings {

// Keys are paths with backslashes. Names are found in any case and keep the spelling with which they were created. Each
// change replaces the file atomically under a lock, so that two processes can write at the same time.

/// Throws RuntimeError if the file exists but can't be read or is not a settings file; such a file is never
/// overwritten. Removes the rights of other users, because the file contains the database's password. A missing file is
/// fine.
void check();

enum class Hive { ClassesRoot, CurrentUser, LocalMachine };
enum class Type { Text = 1, Binary = 3, Number = 4 };

/// A value and its type.
struct Value {
    Type type = Type::Text;
    QString data;  // a Number is stored as decimal text

    bool operator==(const Value&) const = default;
};

/// A value with its place.
struct Entry {
    Hive hive = Hive::LocalMachine;
    QString key;
    QString name;
    Value value;
};

/// Returns true if the key exists.
bool keyExists(Hive hive, const QString& key);
/// Returns a value, or nothing if the key or the value is missing. An empty name is the key's default value.
std::optional<Value> query(Hive hive, const QString& key, const QString& name);
/// Sets a value. Returns false if the key does not exist or the file can't be written.
bool setValue(Hive hive, const QString& key, const QString& name, const Value& value);
/// Creates the key and the keys above it. Returns false if the file can't be written.
bool createKey(Hive hive, const QString& key);
/// Removes a key and its values. Returns false if it is missing, has subkeys or can't be removed.
bool removeKey(Hive hive, const QString& key);
/// Returns why the last change failed. The text is empty if it did not, or if there was nothing to change.
QString changeFailure();
/// Returns all values.
QList<Entry> entries();

/// Returns a value from the per-user area of applications, or `fallback` if there is none.
QString userSetting(const QString& application, const QString& section, const QString& name, const QString& fallback);

}  // namespace kest::settings

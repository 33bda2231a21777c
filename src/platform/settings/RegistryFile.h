// Reads and writes the text of registry.ini, which has a section for each key and a line for each value.
#pragma once

#include "platform/settings/registry.h"

#include <QByteArray>
#include <QHash>
#include <QList>

namespace kest::settings {

/// The content of the file in its order. Keys are paths that begin with the name of the hive.
//
//   ; Settings of KEST2
//   [HKEY_LOCAL_MACHINE\SOFTWARE\wirra32\frmsplash]
//   EcomHome=text:c:\wirdoc\           a value; "@" is the key's default value
//   Retries=number:3
//
// Control characters, "%", and characters with a meaning at their place are written as %XX, in UTF-8.
class RegistryFile {
public:
    /// A named value of a key.
    struct Value {
        QString name;
        settings::Value value;
    };
    /// A key with its values.
    struct Key {
        QString path;
        QList<Value> values;
    };

    /// Returns true if the bytes are a settings file, and false if they are empty or another program has written them.
    static bool isOne(const QByteArray& bytes);
    /// Reads the content of a file.
    static RegistryFile fromBytes(const QByteArray& bytes);
    /// Returns the content as it is written.
    QByteArray toBytes() const;

    const QList<Key>& keys() const { return allKeys; }
    /// Returns a key, or null if it does not exist.
    const Key* find(const QString& path) const;
    /// Returns a value, or null if it does not exist.
    const settings::Value* find(const QString& path, const QString& name) const;
    bool hasSubkeys(const QString& path) const;

    /// Returns the key. Creates it and the keys above it if necessary.
    Key& make(const QString& path);
    void set(const QString& path, const QString& name, const settings::Value& value);
    void remove(const QString& path);

private:
    QList<Key> allKeys;
    QHash<QString, qsizetype> places;  // the index of each path, in folded case
};

}  // namespace kest::settings

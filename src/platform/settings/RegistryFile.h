// The text of registry.ini: sections for keys, one line for each value.
#pragma once

#include "platform/settings/registry.h"

#include <QByteArray>
#include <QHash>
#include <QList>

namespace kest::settings {

/// What the file holds, in its order. Keys are paths that begin with the hive's name.
//
//   ; Settings of KEST2
//   [HKEY_LOCAL_MACHINE\SOFTWARE\wirra32\frmsplash]
//   EcomHome=text:c:\wirdoc\           a value; "@" is the key's default value
//   Retries=number:3
//
// Control characters, "%", and what has a meaning at its place are written as %XX of their UTF-8 bytes.
class RegistryFile {
public:
    struct Value {
        QString name;
        settings::Value value;
    };
    struct Key {
        QString path;
        QList<Value> values;
    };

    /// False for an empty file, and for one that something else has written.
    static bool isOne(const QByteArray& bytes);
    static RegistryFile fromBytes(const QByteArray& bytes);
    QByteArray toBytes() const;

    const QList<Key>& keys() const { return allKeys; }
    const Key* find(const QString& path) const;
    const settings::Value* find(const QString& path, const QString& name) const;
    bool hasSubkeys(const QString& path) const;

    /// Makes the key and those above it.
    Key& make(const QString& path);
    void set(const QString& path, const QString& name, const settings::Value& value);
    void remove(const QString& path);

private:
    QList<Key> allKeys;
    QHash<QString, qsizetype> places;  // of a path without regard to case: its index
};

}  // namespace kest::settings

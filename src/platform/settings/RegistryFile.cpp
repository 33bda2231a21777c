#include "platform/settings/RegistryFile.h"

#include <algorithm>
#include <utility>

using namespace Qt::StringLiterals;

namespace kest::settings {

namespace {

constexpr auto heading = "; Settings of KEST2\n";
constexpr auto startOfHives = "HKEY_"_L1;
constexpr qsizetype deepestKey = 64;  // names in a path; each path also creates the keys above it

constexpr std::pair<Type, QLatin1StringView> typeNames[] = {
    {Type::Text, "text"_L1},
    {Type::Binary, "binary"_L1},
    {Type::Number, "number"_L1},
};

/// Escapes a text. `special` are the characters that have a meaning at this place.
QByteArray escaped(const QString& text, QByteArrayView special)
{
    QByteArray out;
    const QByteArray utf8 = text.toUtf8();
    for (qsizetype i = 0; i < utf8.size(); ++i) {
        const char c = utf8[i];
        const bool control = static_cast<unsigned char>(c) < 0x20 || c == 0x7F;
        const bool outerBlank = c == ' ' && (i == 0 || i == utf8.size() - 1);
        if (c == '%' || control || outerBlank || special.contains(c))
            out += '%' + QByteArray(1, c).toHex().toUpper();
        else
            out += c;
    }
    return out;
}

QString unescaped(const QByteArray& text)
{
    return QString::fromUtf8(QByteArray::fromPercentEncoding(text));
}

/// Returns the path of a key without surplus backslashes, or an empty text if it has too many names.
QString pathIn(const QByteArray& text)
{
    const QStringList names = unescaped(text).split(u'\\', Qt::SkipEmptyParts);
    return names.size() > deepestKey ? QString() : names.join(u'\\');
}

QString folded(const QString& path)
{
    return path.toCaseFolded();
}

}  // namespace

bool RegistryFile::isOne(const QByteArray& bytes)
{
    if (bytes.contains('\0'))
        return false;
    return bytes.startsWith(heading) || std::ranges::any_of(fromBytes(bytes).keys(), [](const Key& key) {
               return key.path.startsWith(startOfHives, Qt::CaseInsensitive);
           });
}

RegistryFile RegistryFile::fromBytes(const QByteArray& bytes)
{
    RegistryFile file;
    QString path;
    for (const QByteArray& written : bytes.split('\n')) {
        const QByteArray line = written.trimmed();
        if (line.startsWith('[') && line.endsWith(']')) {
            path = pathIn(line.sliced(1, line.size() - 2));
            if (!path.isEmpty())
                file.make(path);
            continue;
        }
        const qsizetype equals = line.indexOf('=');
        const qsizetype colon = line.indexOf(':', equals);
        if (path.isEmpty() || line.startsWith(';') || equals < 0 || colon < 0)
            continue;  // a comment
        const QString type = QString::fromUtf8(line.sliced(equals + 1, colon - equals - 1)).trimmed();
        const QByteArray name = line.first(equals).trimmed();
        for (const auto& [number, typeName] : typeNames) {
            if (type.compare(typeName, Qt::CaseInsensitive) == 0)
                file.set(path, name == "@" ? QString() : unescaped(name), {number, unescaped(line.sliced(colon + 1))});
        }
    }
    return file;
}

QByteArray RegistryFile::toBytes() const
{
    QByteArray out = heading;
    for (const Key& key : allKeys) {
        out += '[' + escaped(key.path, "]") + "]\n";
        for (const Value& value : key.values) {
            out += value.name.isEmpty() ? "@" : escaped(value.name, "=[;@");
            for (const auto& [number, typeName] : typeNames) {
                if (number == value.value.type)
                    out += '=' + QByteArray(typeName.data(), typeName.size()) + ':';
            }
            out += escaped(value.value.data, {}) + '\n';
        }
        out += '\n';
    }
    return out;
}

const RegistryFile::Key* RegistryFile::find(const QString& path) const
{
    const auto place = places.constFind(folded(path));
    return place == places.cend() ? nullptr : &allKeys[*place];
}

const settings::Value* RegistryFile::find(const QString& path, const QString& name) const
{
    const Key* const key = find(path);
    if (!key)
        return nullptr;
    for (const Value& value : key->values) {
        if (value.name.compare(name, Qt::CaseInsensitive) == 0)
            return &value.value;
    }
    return nullptr;
}

bool RegistryFile::hasSubkeys(const QString& path) const
{
    const QString start = path + u'\\';
    for (const Key& key : allKeys) {
        if (key.path.startsWith(start, Qt::CaseInsensitive))
            return true;
    }
    return false;
}

RegistryFile::Key& RegistryFile::make(const QString& path)
{
    const auto place = places.constFind(folded(path));
    if (place != places.cend())
        return allKeys[*place];
    const qsizetype parent = path.lastIndexOf(u'\\');
    if (parent > 0)
        make(path.first(parent));
    places.insert(folded(path), allKeys.size());
    allKeys.append({path, {}});
    return allKeys.last();
}

void RegistryFile::set(const QString& path, const QString& name, const settings::Value& value)
{
    Key& key = make(path);
    for (Value& known : key.values) {
        if (known.name.compare(name, Qt::CaseInsensitive) == 0) {
            known.value = value;
            return;
        }
    }
    key.values.append({name, value});
}

void RegistryFile::remove(const QString& path)
{
    const auto place = places.constFind(folded(path));
    if (place == places.cend())
        return;
    allKeys.removeAt(*place);
    places.clear();
    for (qsizetype i = 0; i < allKeys.size(); ++i)
        places.insert(folded(allKeys[i].path), i);
}

}  // namespace kest::settings

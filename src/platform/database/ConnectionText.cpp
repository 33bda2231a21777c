#include "platform/database/ConnectionText.h"

#include <QStringList>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

ConnectionText::ConnectionText(const QString& text)
{
    for (qsizetype i = 0; i < text.size();) {
        const qsizetype equals = text.indexOf(u'=', i);
        if (equals < 0)
            break;
        const bool braced = equals + 1 < text.size() && text[equals + 1] == u'{';  // may contain a ";"
        const qsizetype close = braced ? text.indexOf(u'}', equals) : -1;
        const qsizetype end = text.indexOf(u';', close < 0 ? equals : close);
        const qsizetype stop = end < 0 ? text.size() : end;
        fields.append({text.sliced(i, equals - i).trimmed(), text.sliced(equals + 1, stop - equals - 1).trimmed()});
        i = stop + 1;
    }
}

const ConnectionText::Field* ConnectionText::find(QStringView name) const
{
    const auto found = std::find_if(fields.begin(), fields.end(), [&](const Field& field) {
        return name.compare(field.name, Qt::CaseInsensitive) == 0;
    });
    return found == fields.end() ? nullptr : &*found;
}

QString ConnectionText::value(QStringView name) const
{
    const Field* field = find(name);
    if (!field)
        return {};
    const bool braced = field->value.startsWith(u'{') && field->value.endsWith(u'}');
    return braced ? field->value.sliced(1, field->value.size() - 2).trimmed() : field->value;
}

QString ConnectionText::value(QStringView name, QStringView otherName) const
{
    return value(has(name) ? name : otherName);
}

bool ConnectionText::has(QStringView name) const
{
    return find(name) != nullptr;
}

void ConnectionText::set(const QString& name, const QString& value)
{
    for (Field& field : fields) {
        if (field.name.compare(name, Qt::CaseInsensitive) == 0) {
            field.value = value;
            return;
        }
    }
    fields.append({name, value});
}

void ConnectionText::remove(QStringView name)
{
    fields.removeIf([&](const Field& field) { return name.compare(field.name, Qt::CaseInsensitive) == 0; });
}

void ConnectionText::add(const ConnectionText& other)
{
    for (const Field& field : other.fields)
        set(field.name, field.value);
}

QString ConnectionText::text() const
{
    QStringList parts;  // with a ";" at the end, the driver manager would read an empty field after it, and fail
    for (const Field& field : fields)
        parts.append(field.name + u'=' + field.value);
    return parts.join(u';');
}

}  // namespace kest::db

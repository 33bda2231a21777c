// Splits a connection text of the form "Driver={...};Server=...;Database=...;Uid=...;Pwd=...;" into its fields.
#pragma once

#include <QList>
#include <QString>

namespace kest::db {

/// The fields of a connection text, in their order. Names are compared without regard to case.
class ConnectionText {
public:
    explicit ConnectionText(const QString& text);

    /// Returns the value of the first field with that name, without its braces, or an empty text.
    QString value(QStringView name) const;
    QString value(QStringView name, QStringView otherName) const;
    bool has(QStringView name) const;
    /// Replaces the value of a field, or adds the field at the end.
    void set(const QString& name, const QString& value);
    void remove(QStringView name);
    /// Sets each field of another text.
    void add(const ConnectionText& other);

    /// Returns the text, without a ";" at its end.
    QString text() const;

private:
    struct Field {
        QString name;
        QString value;  // as written, with its braces
    };
    const Field* find(QStringView name) const;

    QList<Field> fields;
};

}  // namespace kest::db

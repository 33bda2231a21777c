#include "base/JournalRecord.h"

#include "platform/RuntimeError.h"

#include <QDateTime>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QLocale>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

/// A type's letter and the value's text; a text alone has no letter.
QJsonValue jsonOf(const QVariant& value)
{
    if (value.isNull())
        return QJsonValue::Null;
    switch (value.typeId()) {
        case QMetaType::Bool:
            return value.toBool();
        case QMetaType::LongLong:
            return QJsonArray{u"n"_s, QString::number(value.toLongLong())};
        case QMetaType::Double:
            return QJsonArray{u"f"_s, QString::number(value.toDouble(), 'g', QLocale::FloatingPointShortest)};
        case QMetaType::QByteArray:
            return QJsonArray{u"b"_s, QString::fromLatin1(value.toByteArray().toBase64())};
        case QMetaType::QDateTime:
            return QJsonArray{u"d"_s, value.toDateTime().toString(Qt::ISODateWithMs)};
        default:
            return value.toString();
    }
}

QVariant valueIn(const QJsonValue& json)
{
    if (json.isNull())
        return {};
    if (json.isBool())
        return json.toBool();
    if (json.isString())
        return json.toString();
    const QString letter = json.toArray().at(0).toString();
    const QString text = json.toArray().at(1).toString();
    if (letter == "n"_L1)
        return text.toLongLong();
    if (letter == "f"_L1)
        return text.toDouble();
    if (letter == "d"_L1)
        return QDateTime::fromString(text, Qt::ISODateWithMs);
    if (letter == "b"_L1)
        return QByteArray::fromBase64(text.toLatin1());
    throw RuntimeError(TypeMismatch, u"The journal holds a value of an unknown type: "_s + letter);
}

}  // namespace

QString asciiJson(const QJsonObject& object)
{
    const QString json = QString::fromUtf8(QJsonDocument(object).toJson(QJsonDocument::Compact));
    QString text;
    text.reserve(json.size());
    for (const QChar c : json) {
        if (c.unicode() < 0x80)
            text += c;
        else
            text += u"\\u%1"_s.arg(c.unicode(), 4, 16, QChar(u'0'));
    }
    return text;
}

QString textOf(const db::RowChange& change)
{
    QJsonArray columns;
    for (const db::RowChange::Column& column : change.columns)
        columns.append(QJsonArray{column.name, int(column.kind), jsonOf(column.before), jsonOf(column.after)});
    const QJsonObject object{{u"change"_s, int(change.kind)},
                             {u"table"_s, change.table},
                             {u"key"_s, QJsonArray::fromStringList(change.key)},
                             {u"columns"_s, columns}};
    return asciiJson(object);
}

db::RowChange changeIn(const QString& text)
{
    const QJsonObject object = QJsonDocument::fromJson(text.toUtf8()).object();
    if (!object.contains(u"table"_s))
        throw RuntimeError(TypeMismatch, u"The journal holds a text that is no change."_s);
    db::RowChange change;
    change.kind = db::ChangeKind(object[u"change"_s].toInt());
    change.table = object[u"table"_s].toString();
    for (const QJsonValue name : object[u"key"_s].toArray())
        change.key.append(name.toString());
    for (const QJsonValue entry : object[u"columns"_s].toArray()) {
        const QJsonArray column = entry.toArray();
        change.columns.append(
            {column.at(0).toString(), db::Kind(column.at(1).toInt()), valueIn(column.at(2)), valueIn(column.at(3))});
    }
    return change;
}

}  // namespace kest::journal

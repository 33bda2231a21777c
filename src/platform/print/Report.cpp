#include "platform/print/Report.h"

#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/files/files.h"
#include "platform/values.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QRegularExpression>
#include <QTextDocumentFragment>

#include <algorithm>
#include <kainjow/mustache.hpp>

namespace kest::report {

using namespace Qt::StringLiterals;
namespace mustache = kainjow::mustache;

namespace {

constexpr qsizetype longestBody = 10'000'000;  // characters

[[noreturn]] void noTemplate(const QString& why)
{
    throw RuntimeError(TypeMismatch, u"The file is not a report template: "_s + why);
}

QString between(const QString& text, const QString& start, const QString& end)
{
    const QRegularExpression part(start + u"(.*?)"_s + end, QRegularExpression::DotMatchesEverythingOption |
                                                                QRegularExpression::CaseInsensitiveOption);
    return part.match(text).captured(1);
}

/// Returns the names of all tags, each once.
QStringList tagsIn(const QString& part)
{
    static const QRegularExpression tag(u"\\{\\{[#^/&]?\\s*([^{}]+?)\\s*\\}\\}"_s);
    QStringList names;
    for (auto match = tag.globalMatch(part); match.hasNext();)
        names.append(match.next().captured(1));
    names.removeDuplicates();
    return names;
}

/// A condition such as "field=A|B" or "field!=A|B".
struct Condition {
    QString field;
    QStringList values;
    bool negated = false;

    static Condition in(const QString& text)
    {
        const qsizetype at = text.indexOf(u'=');
        if (at < 0)
            return {};
        const bool negated = at > 0 && text[at - 1] == u'!';
        return {text.first(negated ? at - 1 : at), text.sliced(at + 1).split(u'|'), negated};
    }
    bool isGiven() const { return !field.isEmpty(); }
};

/// Alternatives such as "A=1,B=2;C=3": commas separate the conditions of an alternative, semicolons the alternatives.
using Alternatives = QList<QList<Condition>>;

Alternatives alternativesIn(const QString& text)
{
    Alternatives alternatives;
    for (const QString& alternative : text.split(u';')) {
        QList<Condition> conditions;
        for (const QString& condition : alternative.split(u',', Qt::SkipEmptyParts))
            conditions.append(Condition::in(condition.trimmed()));
        alternatives.append(conditions);
    }
    return alternatives;
}

/// A row whose values are found by the names of their fields, in any case.
class Row {
public:
    Row(const Table& table, const QVariantList* values) : names(&table.fields), cells(values) {}

    bool has(const QString& field) const { return names->contains(field, Qt::CaseInsensitive); }
    QString text(const QString& field) const
    {
        for (qsizetype i = 0; cells && i < names->size() && i < cells->size(); ++i)
            if (names->at(i).compare(field, Qt::CaseInsensitive) == 0)
                return textOrEmpty(cells->at(i));
        return {};
    }
    bool meets(const Condition& condition) const
    {
        const bool isOne = condition.values.contains(text(condition.field).trimmed(), Qt::CaseInsensitive);
        return isOne != condition.negated;
    }
    bool meetsOne(const Alternatives& alternatives) const
    {
        return std::ranges::any_of(alternatives, [&](const QList<Condition>& conditions) {
            return std::ranges::all_of(conditions, [&](const Condition& condition) { return meets(condition); });
        });
    }

private:
    const QStringList* names;
    const QVariantList* cells;
};

QString asMoney(const QString& text)
{
    const std::optional<double> amount = numberIn(text);
    return amount ? QLocale::c().toString(*amount, 'f', 2) : text;
}

QString asDate(const QString& text)
{
    const std::optional<QDateTime> date = dateIn(text);
    return date ? shortDate(date->date()) : text;
}

mustache::data valueOf(const QString& tag, const Row& row)
{
    if (const Condition condition = Condition::in(tag); condition.isGiven())
        return mustache::data(row.meets(condition));
    const QString field = tag.section(u':', 0, 0);
    const QString format = tag.section(u':', 1);
    const QString text = row.text(field).remove(u'\r');  // Qt's HTML uses line feeds
    return (format == u"money"_s ? asMoney(text) : format == u"date"_s ? asDate(text) : text).toStdString();
}

/// Returns the part of a tag before its format or condition.
QString fieldOf(const QString& tag)
{
    const auto end = std::find_if(tag.begin(), tag.end(), [](QChar c) { return c == u':' || c == u'=' || c == u'!'; });
    return QString(tag.begin(), end - tag.begin());
}

bool isOfRows(const QString& tag)
{
    return tag == u"rows"_s || tag.startsWith(u"rows:"_s) || tag.startsWith(u"any:"_s);
}

}  // namespace

Table tableOf(db::Recordset& rows)
{
    Table table{rows.columns(), {}};
    if (rows.recordCount() == 0)
        return table;
    for (rows.moveFirst(); !rows.eof(); rows.moveNext()) {
        QVariantList values;
        for (const QString& field : std::as_const(table.fields)) {
            const QVariant value = rows.value(field);
            values.append(value.isNull() ? QVariant() : toText(value));
        }
        table.rows.append(values);
    }
    rows.moveFirst();
    return table;
}

Report::Report(const QString& path)
{
    const QString text = QString::fromUtf8(files::readBytes(path));
    body_ = between(text, u"<body[^>]*>"_s, u"</body>"_s);
    if (body_.trimmed().isEmpty())
        noTemplate(u"it has no body"_s);
    title_ = between(text, u"<title>"_s, u"</title>"_s).trimmed();
    styles = between(text, u"<style[^>]*>"_s, u"</style>"_s);
    readSaved(between(text, u"<script[^>]*type=\"application/json\"[^>]*>"_s, u"</script>"_s));
    putInFragments();
    for (const auto& [part, tag] : {std::pair(&header_, u"header"_s), std::pair(&footer_, u"footer"_s)}) {
        *part = between(body_, u"<"_s + tag + u">"_s, u"</"_s + tag + u">"_s);
        body_.remove(QRegularExpression(u"<%1>.*?</%1>"_s.arg(tag), QRegularExpression::DotMatchesEverythingOption |
                                                                        QRegularExpression::CaseInsensitiveOption));
    }
    for (const QString& part : {header_, footer_, body_})
        if (const mustache::mustache parsed(part.toStdString()); !parsed.is_valid())
            noTemplate(QString::fromStdString(parsed.error_message()));
}

void Report::putInFragments()
{
    static const QRegularExpression fragment(
        u"<template\\s+id=\"([^\"]+)\">(.*?)</template>"_s,
        QRegularExpression::DotMatchesEverythingOption | QRegularExpression::CaseInsensitiveOption);
    for (auto found = fragment.match(body_); found.hasMatch(); found = fragment.match(body_)) {
        const QString place = u"{{>"_s + found.captured(1) + u"}}"_s;
        const QString text = found.captured(2).trimmed();
        body_.remove(found.capturedStart(), found.capturedLength());
        if (body_.size() + body_.count(place) * text.size() > longestBody)
            noTemplate(u"its fragments contain each other"_s);
        body_.replace(place, text);
    }
}

void Report::readSaved(const QString& json)
{
    if (json.isEmpty())
        return;
    QJsonParseError error;
    const QJsonObject saved = QJsonDocument::fromJson(json.toUtf8(), &error).object();
    if (error.error != QJsonParseError::NoError)
        noTemplate(error.errorString());
    for (const QJsonValue parameter : saved[u"parameters"_s].toArray())
        parameters_.append({parameter[u"name"_s].toString(), parameter[u"value"_s].toString()});
    const QJsonObject named = saved[u"groups"_s].toObject();
    for (auto group = named.begin(); group != named.end(); ++group)
        groups.insert(group.key(), group.value().toString());
    for (const QJsonValue row : saved[u"rows"_s].toArray()) {
        const QJsonObject cells = row.toObject();
        QVariantList values(table_.fields.size());
        for (auto cell = cells.begin(); cell != cells.end(); ++cell) {
            if (!table_.fields.contains(cell.key())) {
                table_.fields.append(cell.key());
                values.append(QVariant());
            }
            values[table_.fields.indexOf(cell.key())] = cell.value().toVariant();
        }
        table_.rows.append(values);
    }
}

QString Report::body() const
{
    return filled(body_, 0, 0);
}

QString Report::heading() const
{
    static const QRegularExpression heading(u"<h1[^>]*>(.*?)</h1>"_s, QRegularExpression::DotMatchesEverythingOption);
    const QString html = heading.match(body()).captured(1);
    const QString text = QTextDocumentFragment::fromHtml(html).toPlainText().simplified();
    return text.isEmpty() ? title_ : text;
}

QString Report::filled(const QString& part, int page, int pages) const
{
    const QStringList tags = tagsIn(part);
    const auto rowData = [&](const Row& row) {
        mustache::data data(mustache::data::type::object);
        for (const QString& tag : tags)
            if (row.has(fieldOf(tag)))
                data.set(tag.toStdString(), valueOf(tag, row));
        return data;
    };
    const Table& outside = table_.rows.isEmpty() && !outside_.rows.isEmpty() ? outside_ : table_;
    mustache::data data = rowData(Row(outside, outside.rows.isEmpty() ? nullptr : &outside.rows.first()));
    for (const QString& tag : tags) {
        if (!isOfRows(tag))
            continue;
        const QString group = tag.section(u':', 1);
        const Alternatives alternatives = alternativesIn(groups.value(group, group));
        mustache::data list(mustache::data::type::list);
        for (const QVariantList& values : table_.rows)
            if (const Row row(table_, &values); row.meetsOne(alternatives))
                list.push_back(rowData(row));
        data.set(tag.toStdString(), tag.startsWith(u"any:"_s) ? mustache::data(list.is_non_empty_list()) : list);
    }
    for (const Parameter& parameter : parameters_)
        data.set(parameter.name.toStdString(), parameter.value.toStdString());
    data.set("page", std::to_string(page));
    data.set("pages", std::to_string(pages));
    mustache::mustache filling(part.toStdString());
    return u"<html><head><style>"_s + styles + u"</style></head><body>"_s +
           QString::fromStdString(filling.render(data)) + u"</body></html>"_s;
}

}  // namespace kest::report

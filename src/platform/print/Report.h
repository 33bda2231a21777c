// A report: a template that a shop can change, its parameters, and the table that it shows.
#pragma once

#include <QList>
#include <QString>
#include <QStringList>
#include <QVariant>

namespace kest::db {
class Recordset;
}

namespace kest::report {

/// The rows that a report shows. A value that was never set is null.
struct Table {
    QStringList fields;
    QList<QVariantList> rows;
};

/// All rows of a recordset, each value as text. Leaves it on its first row.
Table tableOf(db::Recordset& rows);

struct Parameter {
    QString name;
    QString value;
};

/// One template, opened. Its tags are those of mustache:
///
///   {{field}}              of the row, or outside of rows of the first one; {{parameter}}; {{page}} and {{pages}}
///   {{field:money}}        with two decimals, where it is a number
///   {{field:date}}         as dd/MM/yyyy, where it is a date
///   {{#rows}}...{{/rows}}  once for each row; {{#rows:field=A|B}} for those with one of these values,
///   {{#rows:field!=A}}
///                          for those without; several conditions joined by commas, alternatives by semicolons;
///   {{#rows:name}}         for those of a group, whose conditions stand under this name in the template
///   {{#any:field=A|B}}     once where there is such a row
///   {{#field=A|B}}         where the row has one of these values; {{^field=A|B}} where it has not
///   {{>name}}              what stands in <template id="name">
class Report {
public:
    /// Throws FileNotFound and the like for a file that cannot be read, TypeMismatch for one that is no template.
    explicit Report(const QString& path);

    const QString& title() const { return title_; }
    const QList<Parameter>& parameters() const { return parameters_; }
    void setParameter(qsizetype index, const QString& value) { parameters_[index].value = value; }

    /// Without one the report shows the rows that are saved in the template.
    void setTable(Table table) { table_ = std::move(table); }

    /// The parts of the report as HTML, all tags filled in.
    QString body() const;
    QString header(int page, int pages) const { return filled(header_, page, pages); }
    QString footer(int page, int pages) const { return filled(footer_, page, pages); }

private:
    QString filled(const QString& part, int page, int pages) const;
    void putInFragments();
    void readSaved(const QString& json);

    QString title_;
    QString styles;
    QString body_;
    QString header_;
    QString footer_;
    QList<Parameter> parameters_;
    QHash<QString, QString> groups;
    Table table_;
};

}  // namespace kest::report

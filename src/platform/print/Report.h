// A report: a template that a shop can change, its parameters and its table.
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

/// Returns all rows of a recordset with each value as text. The first row is current afterwards.
Table tableOf(db::Recordset& rows);

/// A named value of a report, shown by the tag `{{name}}`.
struct Parameter {
    QString name;
    QString value;
};

/// A report template. Its tags are those of mustache:
///
///   {{field}}              the value of a field; outside of rows, that of the first row
///   {{parameter}}          the value of a parameter
///   {{page}} and {{pages}} the number of the page and of all pages
///   {{field:money}}        with two decimals if it is a number
///   {{field:date}}         as dd/MM/yyyy if it is a date
///   {{#rows}}...{{/rows}}  once for each row; {{#rows:field=A|B}} for those with one of these values,
///   {{#rows:field!=A}}
///                          for those without; commas join conditions, semicolons join alternatives;
///   {{#rows:name}}         for those of a group, whose conditions the template defines under this name
///   {{#any:field=A|B}}     once if there is such a row
///   {{#field=A|B}}         if the row has one of these values; {{^field=A|B}} if it has none of them
///   {{>name}}              the content of <template id="name">
class Report {
public:
    /// Reads a template. Throws FileNotFound or another file error if it can't be read, and TypeMismatch if the file is
    /// not a template.
    explicit Report(const QString& path);

    const QString& title() const { return title_; }
    /// Returns the first heading of the report, such as "Authorised quote 1007", or its title if it has none.
    QString heading() const;
    /// The author of its PDF file; none if empty.
    const QString& author() const { return author_; }
    void setAuthor(const QString& name) { author_ = name; }
    const QList<Parameter>& parameters() const { return parameters_; }
    void setParameter(qsizetype index, const QString& value) { parameters_[index].value = value; }

    /// Sets the rows to show. Without this call, the report shows the rows that are saved in the template.
    void setTable(Table table) { table_ = std::move(table); }

    /// Sets a table whose first row the tags outside of rows show if the table of the report has no row.
    void setOutside(Table table) { outside_ = std::move(table); }

    /// The parts of the report as HTML, with all tags filled in.
    QString body() const;
    QString header(int page, int pages) const { return filled(header_, page, pages); }
    QString footer(int page, int pages) const { return filled(footer_, page, pages); }

private:
    QString filled(const QString& part, int page, int pages) const;
    void putInFragments();
    void readSaved(const QString& json);

    QString title_;
    QString author_;
    QString styles;
    QString body_;
    QString header_;
    QString footer_;
    QList<Parameter> parameters_;
    QHash<QString, QString> groups;
    Table table_;
    Table outside_;
};

}  // namespace kest::report

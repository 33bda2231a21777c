#include "support/Row.h"

#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "shell/SharedVariables.h"
#include "support/Cases.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

QString withoutDate(QString text)
{
    return text.replace(shortDate(QDate::currentDate()), u"today"_s);
}

db::Recordset opened(const QString& select)
{
    db::Recordset rows(gConn);
    rows.open(select);
    return rows;
}

db::Recordset rowsOf(const QString& table, const QString& condition)
{
    return opened(u"SELECT * FROM %1 WHERE %2"_s.arg(table, condition));
}

}  // namespace

bool Row::exists() const
{
    return !rowsOf(table_, condition_).eof();
}

QVariant Row::value(const Text& column) const
{
    return rowsOf(table_, condition_).value(column);
}

std::string Row::text(const Text& column) const
{
    return textOrEmpty(value(column)).toStdString();
}

double Row::number(const Text& column) const
{
    return toDouble(value(column));
}

::testing::AssertionResult Row::shows(const Text& columns) const
{
    const db::Recordset row = rowsOf(table_, condition_);
    QStringList others;
    for (const auto& [column, expected] : pairsIn(columns)) {
        const QString found = row.isNull(column) ? u"-"_s : withoutDate(row.text(column));
        if (found != expected)
            others += column + u'=' + found;
    }
    return (others.isEmpty() ? ::testing::AssertionSuccess() : ::testing::AssertionFailure())
           << others.join(u' ').toStdString();
}

void Row::write(const Text& column, const Value& value)
{
    db::Recordset row = rowsOf(table_, condition_);
    row.set(column, value);
    row.update();
}

int rowCount(const Text& table, const Text& condition)
{
    return rowsOf(table, condition).recordCount();
}

CarRow& CarRow::customer(const Text& name)
{
    return set("CUST_ID", test::customer(name).id());
}

QuoteRow::QuoteRow(const Text& number, int subquote, const Text& condition)
    : RowOf("QUOTE1", condition), quoteNumber_(number), subquote_(subquote)
{
}

QString QuoteRow::key() const
{
    return sql("QTNNO='{}' AND Subquote={}", quoteNumber_, subquote_);
}

QuoteRow& QuoteRow::request(const Text& number, const Text& version)
{
    set("KESTQRNo", Value(QString(number)));
    return set("KESTQRVer", Value(QString(version)));
}

QuoteRow& QuoteRow::note(const Text& words, const Text& day)
{
    const QString chain = textOrEmpty(texts().value("remarks"));
    return remarks(u"(%1 : %2) %3"_s.arg(QString(day), QString(words), chain).trimmed());
}

QuoteRow& QuoteRow::remarks(const Text& text, const Text& column)
{
    db::Recordset row = rowsOf(u"QUOTE3"_s, key());
    row.set(column, QString(text));
    row.update();
    return *this;
}

bool QuoteRow::locked() const
{
    const QVariant readOnly = value("ReadOnly");
    return !readOnly.isNull() && toBool(readOnly);
}

std::string QuoteRow::notes() const
{
    return withoutDate(textOrEmpty(texts().value("remarks"))).toStdString();
}

std::string QuoteRow::state() const
{
    const std::string network = text("KESTQuoteNo");
    return std::to_string(stage()) + (locked() ? " locked " : " open ") + (network.empty() ? "-" : network) + ' ' +
           notes();
}

Row QuoteRow::texts() const
{
    return Row("QUOTE3", key());
}

LineRow QuoteRow::line(int sequence, const Text& category, const Text& script)
{
    const QString condition = key() + sql(" AND SEQ_NO={}", sequence);
    if (rowCount("QUOTE2", condition) == 0) {
        db::Recordset lines = rowsOf(u"QUOTE2"_s, key());
        lines.addNew();
        lines.set(u"QTNNO"_s, quoteNumber_);
        lines.set(u"Subquote"_s, subquote_);
        lines.set(u"SEQ_NO"_s, sequence);
        lines.set(u"category"_s, QString(category));
        lines.set(u"script"_s, QString(script));
        lines.set(u"PartNo"_s, QString());
        lines.update();
    }
    return LineRow("QUOTE2", condition);
}

int QuoteRow::lines() const
{
    return rowCount("QUOTE2", key());
}

}  // namespace kest::test

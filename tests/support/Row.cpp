#include "support/Row.h"

#include "base/modDBAccess.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "support/ShopDatabase.h"
#include "support/Test.h"

namespace kest::test {

static QString withoutDate(QString text)
{
    return text.replace(shortDate(QDate::currentDate()), u"today"_s);
}

static QString selectOf(const QString& table, const QString& condition)
{
    return u"SELECT * FROM %1 WHERE %2"_s.arg(table, condition);
}

static QString keyOf(const QString& number, int subquote)
{
    return sql("QTNNO='{}' AND Subquote={}", number, subquote);
}

QSqlRecord Row::read() const
{
    const QList<QSqlRecord> rows = plainRows(selectOf(table_, condition_));
    EXPECT_FALSE(rows.isEmpty()) << "no row of " << table_.toStdString() << ": " << condition_.toStdString();
    return rows.value(0);
}

std::string Row::text(const Text& column) const
{
    return plainText(value(column)).toStdString();
}

double Row::number(const Text& column) const
{
    return toDouble(plainText(value(column)));
}

::testing::AssertionResult Row::shows(const Text& columns) const
{
    const QSqlRecord row = read();
    QStringList others;
    for (const auto& [column, expected] : pairsIn(columns)) {
        const QString found = row.isNull(column) ? u"-"_s : withoutDate(plainText(row.value(column)));
        if (found != expected)
            others += column + u'=' + found;
    }
    return (others.isEmpty() ? ::testing::AssertionSuccess() : ::testing::AssertionFailure())
           << others.join(u' ').toStdString();
}

Row& Row::set(const Text& column, const Value& value)
{
    db::Recordset row = opened(selectOf(table_, condition_));
    row.set(column, value);
    row.update();
    return *this;
}

int rowCount(const Text& table, const Text& condition)
{
    return int(plainRows(selectOf(table, condition)).size());
}

void addRow(const Text& table, std::initializer_list<std::pair<const char*, Value>> values, const Text& more)
{
    db::Recordset rows = opened(selectOf(table, u"1=0"_s));
    rows.addNew();
    for (const auto& [column, value] : values)
        rows.set(QString::fromLatin1(column), value);
    for (const auto& [column, value] : pairsIn(more))
        rows.set(column, value == u"-"_s ? QVariant() : QVariant(value));
    rows.update();
}

QuoteRow::QuoteRow(const Text& number, int subquote, const Text& order)
    : Row("QUOTE1", keyOf(number, subquote) + u" ORDER BY "_s + order),
      quoteNumber_(number),
      subquote_(subquote),
      key_(keyOf(number, subquote))
{
}

QuoteRow& QuoteRow::set(const Text& column, const Value& value)
{
    Row::set(column, value);
    return *this;
}

QuoteRow& QuoteRow::request(const Text& number, const Text& version)
{
    set("KESTQRNo", Value(QString(number)));
    return set("KESTQRVer", Value(QString(version)));
}

QuoteRow& QuoteRow::note(const Text& words, const Text& day)
{
    const QString chain = plainText(texts().value("remarks"));
    return remarks(u"(%1 : %2) %3"_s.arg(QString(day), QString(words), chain).trimmed());
}

QuoteRow& QuoteRow::remarks(const Text& text, const Text& column)
{
    texts().set(column, QString(text));
    return *this;
}

std::string QuoteRow::notes() const
{
    return withoutDate(plainText(texts().value("remarks"))).toStdString();
}

std::string QuoteRow::state() const
{
    const std::string network = text("KESTQuoteNo");
    return std::to_string(stage()) + (locked() ? " locked " : " open ") + (network.empty() ? "-" : network) + ' ' +
           notes();
}

Row QuoteRow::texts() const
{
    return Row("QUOTE3", key_);
}

Row QuoteRow::line(int sequence, const Text& category, const Text& script)
{
    const Row line("QUOTE2", key_ + sql(" AND SEQ_NO={}", sequence));
    if (!line.exists())
        addRow("QUOTE2", {{"QTNNO", quoteNumber_},
                          {"Subquote", subquote_},
                          {"SEQ_NO", sequence},
                          {"category", QString(category)},
                          {"script", QString(script)},
                          {"PartNo", ""}});
    return line;
}

int QuoteRow::lines() const
{
    return rowCount("QUOTE2", key_);
}

}  // namespace kest::test

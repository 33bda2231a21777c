// A row of a table, for a test's builders and expectations. Writes the database at once, and reads it through a plain
// query.
#pragma once

#include "support/Text.h"

#include <QSqlRecord>

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>

namespace kest::test {

/// Returns how many rows of `table` meet the condition.
int rowCount(const Text& table, const Text& condition = "1=1");

/// A row, which is read anew each time.
class Row {
public:
    /// Refers to the first row that meets the condition. The row must exist when it is read or written.
    Row(const Text& table, const Text& condition) : table_(table), condition_(condition) {}

    bool exists() const { return rowCount(table_, condition_) > 0; }
    QVariant value(const Text& column) const { return read().value(column); }
    /// Returns the value as `plainText` does.
    std::string text(const Text& column) const;
    double number(const Text& column) const;
    bool isNull(const Text& column) const { return value(column).isNull(); }
    /// Returns the value of the first column.
    int id() const { return read().value(0).toInt(); }
    /// Compares columns with a text such as "category=MIS script=Front bumper bar VENDOR=-". "-" is Null, and "today"
    /// is today's date.
    ::testing::AssertionResult shows(const Text& columns) const;
    Row& set(const Text& column, const Value& value);

private:
    QSqlRecord read() const;

    QString table_;
    QString condition_;
};

/// Adds a row with these values, and with more in the form "column=value". "-" is Null.
void addRow(const Text& table, std::initializer_list<std::pair<const char*, Value>> values, const Text& more = "");

/// A quote: its header, with access to its note chain and its lines.
class QuoteRow : public Row {
public:
    /// `order` decides which row is meant if there are several.
    QuoteRow(const Text& number, int subquote, const Text& order);

    QuoteRow& set(const Text& column, const Value& value);
    QuoteRow& request(const Text& number, const Text& version = "1");
    QuoteRow& quoteNumber(const Text& number) { return set("KESTQuoteNo", Value(QString(number))); }
    QuoteRow& authorised(const Text& number) { return set("KESTAuthNo", Value(QString(number))); }
    QuoteRow& claim(const Text& number) { return set("Claim", Value(QString(number))); }
    QuoteRow& rego(const Text& rego) { return set("REGO", Value(QString(rego))); }
    QuoteRow& stage(int stage) { return set("Job_stage", stage); }
    QuoteRow& locked(bool locked) { return set("ReadOnly", locked); }
    /// Adds a note such as "Active Quote Request" at the front of the chain.
    QuoteRow& note(const Text& words, const Text& day = "01/02/2008");
    /// Sets a column of the quote's long texts.
    QuoteRow& remarks(const Text& text, const Text& column = "remarks");

    int stage() const { return int(number("Job_stage")); }
    bool locked() const { return text("ReadOnly") == "1"; }
    /// Returns the note chain, with "today" for today's date.
    std::string notes() const;
    /// Returns stage, lock, network number and notes: "3 locked KQ1 (01/02/2008 : Responded Quote Request)".
    std::string state() const;
    Row texts() const;

    /// Returns the line with that number. If the quote has none, adds one of that category.
    Row line(int sequence, const Text& category = "R&R", const Text& script = "Front bumper bar");
    int lines() const;

private:
    QString quoteNumber_;
    int subquote_;
    QString key_;
};

}  // namespace kest::test

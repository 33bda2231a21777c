// One row of a table, read and written at once: what a test's builders and expectations are made of.
#pragma once

#include "support/Text.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>

namespace kest::test {

class Row {
public:
    /// The first row that meets the condition; it need not exist until it is read or written.
    Row(const Text& table, const Text& condition) : table_(table), condition_(condition) {}

    bool exists() const;
    QVariant value(const Text& column) const;
    /// Null is the empty text.
    std::string text(const Text& column) const;
    double number(const Text& column) const;
    bool isNull(const Text& column) const { return value(column).isNull(); }
    /// What stands in the first column.
    int id() const;
    /// Whether the columns are as in "category=MIS script=Front bumper bar VENDOR=-", Null being "-" and today
    /// "today".
    ::testing::AssertionResult shows(const Text& columns) const;
    Row& set(const Text& column, const Value& value);

private:
    QString table_;
    QString condition_;
};

/// Rows of `table` that meet the condition.
int rowCount(const Text& table, const Text& condition = "1=1");

void addRow(const Text& table, std::initializer_list<std::pair<const char*, Value>> values);

/// A quote: its header, and through it the note chain and the lines.
class QuoteRow : public Row {
public:
    /// `order` says which one counts where there are several.
    QuoteRow(const Text& number, int subquote, const Text& order);

    QuoteRow& set(const Text& column, const Value& value);
    QuoteRow& request(const Text& number, const Text& version = "1");
    QuoteRow& quoteNumber(const Text& number) { return set("KESTQuoteNo", Value(QString(number))); }
    QuoteRow& authorised(const Text& number) { return set("KESTAuthNo", Value(QString(number))); }
    QuoteRow& claim(const Text& number) { return set("Claim", Value(QString(number))); }
    QuoteRow& rego(const Text& rego) { return set("REGO", Value(QString(rego))); }
    QuoteRow& stage(int stage) { return set("Job_stage", stage); }
    QuoteRow& locked(bool locked) { return set("ReadOnly", locked); }
    /// Puts a note such as "Active Quote Request" in front of the chain.
    QuoteRow& note(const Text& words, const Text& day = "01/02/2008");
    /// A column of the quote's long texts.
    QuoteRow& remarks(const Text& text, const Text& column = "remarks");

    int stage() const { return int(number("Job_stage")); }
    bool locked() const;
    /// The note chain, today's date written as "today".
    std::string notes() const;
    /// Stage, lock, network number and notes: "3 locked KQ1 (01/02/2008 : Responded Quote Request)".
    std::string state() const;
    Row texts() const;

    /// The line of that number; made with `category` where the quote has none.
    Row line(int sequence, const Text& category = "R&R", const Text& script = "Front bumper bar");
    int lines() const;

private:
    QString quoteNumber_;
    int subquote_;
    QString key_;
};

}  // namespace kest::test

// Splits statements into tokens.
#pragma once

#include <QString>

#include <vector>

namespace kest::db {

/// Returns the index after the closing quote of a text that starts with a quote. A doubled closing quote is a quote in
/// the text. Throws StatementFailed if there is no closing quote.
qsizetype endOfQuoted(const QString& statement, qsizetype start, QChar close);

/// The kind of a token.
enum class Part { Blank, Word, Name, Literal, Number, Symbol };  // Name: an identifier in brackets or quotes

/// A part of a statement, such as a word or a literal.
struct Token {
    Part part;
    QString text;
    int valueNumber = -1;  // its number among the values of the statement's shape; -1 if it is none of them

    bool is(QStringView word) const { return part != Part::Literal && text.compare(word, Qt::CaseInsensitive) == 0; }
    bool isIdentifier() const { return part == Part::Word || part == Part::Name; }
    /// Returns the identifier without its brackets or quotes.
    QString name() const { return part == Part::Name ? text.sliced(1, text.size() - 2) : text; }
    /// Returns the text of a literal.
    QString value() const;
};

/// The tokens of a statement.
class Tokens {
public:
    using Index = qsizetype;
    static constexpr Index none = -1;

    /// Throws StatementFailed if a quotation mark is not closed.
    explicit Tokens(const QString& statement);

    Index count() const { return Index(tokens.size()); }
    Token& at(Index i) { return tokens[size_t(i)]; }
    const Token& at(Index i) const { return tokens[size_t(i)]; }
    bool isAt(Index i, QStringView word) const { return i != none && at(i).is(word); }
    /// Returns the next token that is not blank, or none.
    Index next(Index i) const;
    /// Returns the previous token that is not blank, or none.
    Index previous(Index i) const;

    void insert(Index before, Token token) { tokens.insert(tokens.begin() + before, std::move(token)); }
    void erase(Index first, Index end) { tokens.erase(tokens.begin() + first, tokens.begin() + end); }

    auto begin() { return tokens.begin(); }
    auto end() { return tokens.end(); }

private:
    std::vector<Token> tokens;
};

/// A table in a statement.
struct NamedTable {
    QString table;
    QString alias;  // the name of the table if it has no alias

    /// Returns true if the qualifier of a column means this table.
    bool answersTo(QStringView qualifier) const;
};

/// Returns the tables after the FROM, JOIN, INTO or UPDATE at that index.
QList<NamedTable> tablesAfter(const Tokens& tokens, Tokens::Index keyword);
/// Returns true for the keywords after which tables follow.
bool namesTables(const Token& token);

}  // namespace kest::db

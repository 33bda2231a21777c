// A statement in its smallest parts.
#pragma once

#include <QString>

#include <vector>

namespace kest::db {

enum class Part { Blank, Word, Name, Literal, Number, Symbol };  // Name: an identifier in brackets or quotes

struct Token {
    Part part;
    QString text;

    bool is(QStringView word) const { return part != Part::Literal && text.compare(word, Qt::CaseInsensitive) == 0; }
    bool isIdentifier() const { return part == Part::Word || part == Part::Name; }
    /// The identifier without its brackets or quotes.
    QString name() const { return part == Part::Name ? text.sliced(1, text.size() - 2) : text; }
    /// What a literal says.
    QString value() const;
};

class Tokens {
public:
    using Index = qsizetype;
    static constexpr Index none = -1;

    /// Throws StatementFailed for a quotation mark that is not closed.
    explicit Tokens(const QString& statement);

    Index count() const { return Index(tokens.size()); }
    Token& at(Index i) { return tokens[size_t(i)]; }
    const Token& at(Index i) const { return tokens[size_t(i)]; }
    bool isAt(Index i, QStringView word) const { return i != none && at(i).is(word); }
    /// The next one that is not blank, or none.
    Index next(Index i) const;
    Index previous(Index i) const;

    void insert(Index before, Token token) { tokens.insert(tokens.begin() + before, std::move(token)); }
    void erase(Index first, Index end) { tokens.erase(tokens.begin() + first, tokens.begin() + end); }

    auto begin() { return tokens.begin(); }
    auto end() { return tokens.end(); }
    QString text() const;

private:
    std::vector<Token> tokens;
};

/// A table that a statement names.
struct NamedTable {
    QString table;
    QString alias;  // the table's own name if it has no other

    bool answersTo(QStringView qualifier) const;
};

/// The tables listed after the FROM, JOIN, INTO or UPDATE at that place.
QList<NamedTable> tablesAfter(const Tokens& tokens, Tokens::Index keyword);
bool namesTables(const Token& token);

}  // namespace kest::db

#include "platform/database/Statement.h"

#include "platform/RuntimeError.h"
#include "platform/database/Tokens.h"
#include "platform/values.h"

#include <QRegularExpression>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

/// Writes a literal so that its text comes to the database unchanged.
QString escaped(QString literal, const Dialect& dialect)
{
    if (dialect.backslashEscapes)
        literal.replace(u'\\', u"\\\\"_s);
    return dialect.withPrefix(literal);
}

QString exactNumber(const QString& text, double number)
{
    static const QRegularExpression plain(u"\\A[+-]?[0-9]+(\\.[0-9]+)?\\z"_s);
    return plain.match(text).hasMatch() ? text : QString::number(number, 'g', 17);
}

/// Writes a literal that is compared with a number, flag or date column as a value of that kind.
QString written(const QString& literal, const Translated::Use& use, const Dialect& dialect)
{
    const Kind kind = use.comparedWith;
    if (kind == Kind::Text || kind == Kind::LongText)
        return escaped(literal, dialect);
    const QString text = Token{Part::Literal, literal}.value().trimmed();
    if (kind == Kind::Date) {
        const auto date = dateIn(text);
        const QString format = dialect.isoDates ? u"yyyy-MM-ddTHH:mm:ss"_s : u"yyyy-MM-dd HH:mm:ss"_s;
        return date ? u'\'' + date->toString(format) + u'\'' : escaped(literal, dialect);
    }
    const auto isFlag = [&](QStringView word) {
        return kind == Kind::Flag && text.compare(word, Qt::CaseInsensitive) == 0;
    };
    if (text.isEmpty() || isFlag(u"false"))
        return u"0"_s;
    if (const auto number = numberIn(text))
        return exactNumber(text, *number);
    if (isFlag(u"true"))
        return u"1"_s;
    if (use.isAssigned)
        return escaped(literal, dialect);
    return use.isUnequal ? u"1.7e308"_s : u"NULL"_s;  // every number is unequal to it, and none equal, less or greater
}

/// Translates a shape. Each step changes its tokens in place.
class Translation {
public:
    Translation(const Shape& shape, const Dialect& wanted, Schema& known)
        : tokens(shape.text), uses(size_t(shape.values.size())), dialect(wanted), schema(known)
    {
    }

    Translated run()
    {
        refuseSecondStatement();
        numberValues();
        findTables();
        Translated result;
        result.columns = selectedColumns(tokens, schema);
        spellNames();
        writeFlags();
        findComparisons();
        writePatterns();
        if (dialect.likeHasNoIndex)
            writeRanges();
        if (!dialect.plusJoinsTexts)
            joinTexts();
        if (!dialect.top)
            writeLimit();
        result.pieces.append(QString());
        for (const Token& token : tokens) {
            if (token.valueNumber >= 0)
                result.pieces.append(QString());
            else
                result.pieces.last() += token.part == Part::Literal ? escaped(token.text, dialect) : token.text;
        }
        result.uses = std::move(uses);
        return result;
    }

private:
    using Index = Tokens::Index;
    static constexpr Index none = Tokens::none;

    Token& at(Index i) { return tokens.at(i); }
    Index count() const { return tokens.count(); }
    Index next(Index i) const { return tokens.next(i); }
    Index previous(Index i) const { return tokens.previous(i); }
    bool isAt(Index i, QStringView word) const { return tokens.isAt(i, word); }

    void refuseSecondStatement()
    {
        Index end = count();
        while (end > 0 && (at(end - 1).part == Part::Blank || at(end - 1).is(u";")))
            --end;
        tokens.erase(end, count());
        if (std::any_of(tokens.begin(), tokens.end(), [](const Token& token) { return token.is(u";"); }))
            throw RuntimeError(StatementFailed, u"A second statement follows a semicolon."_s);
    }

    void numberValues()
    {
        int last = -1;
        for (Index i = 0; i < count(); ++i) {
            const Index before = previous(i);
            const bool isPattern = before != none && at(before).text.endsWith(u"LIKE", Qt::CaseInsensitive);
            const bool isLiteral = at(i).part == Part::Literal && at(i).text == Shape::literalMark && !isPattern;
            const bool isNumber = at(i).part == Part::Number && at(i).text == Shape::numberMark;
            if (isLiteral || isNumber)
                at(i).valueNumber = ++last;
        }
    }

    void findTables()
    {
        for (Index i = 0; i < count(); ++i) {
            if (namesTables(at(i)))
                tables += tablesAfter(tokens, i);
        }
    }

    void spellNames()
    {
        for (Token& token : tokens) {
            if (!token.isIdentifier())
                continue;
            QString name = token.name();
            if (dialect.caseOfTables) {
                const QString spelling = schema.tableSpelling(name);
                if (!spelling.isEmpty())
                    name = spelling;
            }
            const bool bracketed = token.text.startsWith(u'[');
            if (bracketed)
                token.text = dialect.openQuote + name + dialect.closeQuote;
            else if (token.part == Part::Word)
                token.text = name;
        }
    }

    void writeFlags()
    {
        for (Token& token : tokens) {
            if (token.part != Part::Word)
                continue;
            if (token.is(u"TRUE"))
                token = {Part::Number, u"1"_s};
            else if (token.is(u"FALSE"))
                token = {Part::Number, u"0"_s};
        }
    }

    const TableColumn* columnIn(const QString& tableName, const QString& column)
    {
        const TableInfo* table = schema.table(tableName);
        return table ? table->column(column) : nullptr;
    }

    /// Returns the column whose name ends at a token, or null. Sets `first` to the beginning of the name.
    const TableColumn* columnEndingAt(Index i, Index* first = nullptr)
    {
        if (i == none || !at(i).isIdentifier())
            return nullptr;
        const QString column = at(i).name();
        const Index point = previous(i);
        const bool qualified = isAt(point, u".") && previous(point) != none;
        const Index start = qualified ? previous(point) : i;
        if (first)
            *first = start;
        const QString qualifier = qualified ? at(start).name() : QString();
        for (const NamedTable& table : std::as_const(tables)) {
            if (qualified && !table.answersTo(qualifier))
                continue;
            if (const TableColumn* found = columnIn(table.table, column))
                return found;
        }
        return nullptr;
    }

    const TableColumn* columnStartingAt(Index i)
    {
        if (i == none || !at(i).isIdentifier())
            return nullptr;
        const Index point = next(i);
        return columnEndingAt(isAt(point, u".") && next(point) != none ? next(point) : i);
    }

    void findComparisons()
    {
        static const QStringList comparisons{u"="_s, u"<>"_s, u"!="_s, u"<"_s, u">"_s, u"<="_s, u">="_s};
        bool isAssigned = false;
        for (Index i = 0; i < count(); ++i) {
            const Token& token = at(i);
            if (token.is(u"SET"))
                isAssigned = true;
            else if (token.is(u"WHERE"))
                isAssigned = false;
            else if (token.is(u"IN") && isAt(next(i), u"("))
                writeList(i);
            if (token.part != Part::Symbol || !comparisons.contains(token.text))
                continue;
            const Index left = previous(i);
            const Index right = next(i);
            if (left == none || right == none)
                continue;
            const bool isUnequal = token.is(u"<>") || token.is(u"!=");
            if (at(right).part == Part::Literal)
                compare(at(right), columnEndingAt(left), {.isAssigned = isAssigned, .isUnequal = isUnequal});
            else if (at(left).part == Part::Literal)
                compare(at(left), columnStartingAt(right), {.isAssigned = isAssigned, .isUnequal = isUnequal});
        }
    }

    void writeList(Index in)
    {
        const Index before = previous(in);
        const TableColumn* column = columnEndingAt(isAt(before, u"NOT") ? previous(before) : before);
        const Index start = next(next(in));
        if (isAt(start, u"SELECT"))
            return;  // the literals of an inner query are compared with its own columns
        for (Index i = start; column && i != none && !isAt(i, u")"); i = next(i)) {
            if (at(i).part == Part::Literal)
                compare(at(i), column);
        }
    }

    /// Notes the column with which a literal is compared, or to which it is assigned.
    void compare(Token& literal, const TableColumn* column, Translated::Use use = {})
    {
        if (!column || literal.valueNumber < 0 || size_t(literal.valueNumber) >= uses.size())
            return;
        use.comparedWith = column->kind;
        uses[size_t(literal.valueNumber)] = use;
        if (column->kind == Kind::WholeNumber || column->kind == Kind::Number || column->kind == Kind::Flag)
            literal.part = Part::Number;
    }

    /// A pattern ignores trailing blanks, its own and those of the text, and a bracket without an end has no meaning.
    void writePatterns()
    {
        for (Index i = 0; i < count(); ++i) {
            const Index pattern = at(i).is(u"LIKE") ? next(i) : none;
            if (pattern == none || at(pattern).part != Part::Literal)
                continue;
            QString wanted = at(pattern).value();
            while (wanted.endsWith(u' '))
                wanted.chop(1);
            if (dialect.patternSets)
                wanted = withoutOpenBracket(wanted);
            else
                wanted = withoutSets(wanted, i);
            at(pattern).text = u'\'' + wanted.replace(u'\'', u"''"_s) + u'\'';
        }
    }

    static QString withoutOpenBracket(QString pattern)
    {
        qsizetype open = pattern.indexOf(u'[');
        for (qsizetype close = 0; open >= 0; open = pattern.indexOf(u'[', close)) {
            close = pattern.indexOf(u']', open);
            if (close < 0)
                return pattern.left(open) + pattern.sliced(open).replace(u'[', u"[[]"_s);
        }
        return pattern;
    }

    /// For databases whose LIKE has no sets and compares trailing blanks: turns a pattern with a set into a regular
    /// expression, and compares a pattern without "%" at its end with the text without its trailing blanks.
    QString withoutSets(const QString& pattern, Index like)
    {
        if (pattern.contains(u'[')) {
            at(like).text = u"REGEXP"_s;
            return asRegularExpression(pattern);
        }
        Index last = previous(like);
        if (isAt(last, u"NOT"))
            last = previous(last);
        Index first = none;
        if (!pattern.endsWith(u'%') && columnEndingAt(last, &first)) {
            at(first).text.prepend(u"RTRIM("_s);
            at(last).text.append(u')');
        }
        return pattern;
    }

    /// Adds to a comparison with a plain beginning, LIKE 'x%', the range of the texts that begin so. An index serves
    /// it.
    void writeRanges()
    {
        static const QRegularExpression plainBeginning(u"^[^%_[]+%$"_s);
        const QString afterAllCharacters = QString::fromUcs4(U"\U0010FFFF");
        for (Index i = 0; i < count(); ++i) {
            const Index pattern = at(i).is(u"LIKE") ? next(i) : none;
            Index first = none;
            const TableColumn* column = pattern == none ? nullptr : columnEndingAt(previous(i), &first);
            if (!column || column->kind != Kind::Text || at(pattern).part != Part::Literal ||
                !plainBeginning.match(at(pattern).value()).hasMatch())
                continue;
            QString name;
            for (Index part = first; part <= previous(i); ++part)
                name += at(part).text;
            const QString beginning = at(pattern).value().chopped(1);
            at(pattern).text += u" AND %1>=%2 AND %1<%3)"_s.arg(name, dialect.literal(beginning),
                                                                dialect.literal(beginning + afterAllCharacters));
            at(first).text.prepend(u'(');
        }
    }

    static QString asRegularExpression(const QString& pattern)
    {
        QString result = u"(?s)\\A"_s;
        for (qsizetype i = 0; i < pattern.size(); ++i) {
            const QChar c = pattern[i];
            const qsizetype close = c == u'[' ? pattern.indexOf(u']', i + 1) : -1;
            if (c == u'%')
                result += u".*"_s;
            else if (c == u'_')
                result += u'.';
            else if (close > i + 1) {
                QString set = pattern.sliced(i + 1, close - i - 1);
                set.replace(u'\\', u"\\\\"_s).replace(u'[', u"\\["_s);
                result += u'[' + set + u']';
                i = close;
            } else {
                result += QRegularExpression::escape(QString(c));
            }
        }
        return result + u" *\\z"_s;
    }

    bool isText(Index i, const TableColumn* column) const
    {
        const bool isLiteral = i != none && tokens.at(i).part == Part::Literal;
        return isLiteral || (column && (column->kind == Kind::Text || column->kind == Kind::LongText));
    }
    bool endsText(Index i) { return isText(i, columnEndingAt(i)); }
    bool startsText(Index i) { return isText(i, columnStartingAt(i)); }

    /// A "+" next to a text joins texts, and so do all "+" of the same chain.
    void joinTexts()
    {
        bool chain = false;
        for (int pass = 0; pass < 2; ++pass) {
            chain = false;
            const bool backwards = pass == 1;
            for (Index step = 0; step < count(); ++step) {
                const Index i = backwards ? count() - 1 - step : step;
                const Token& token = at(i);
                const bool plus = token.is(u"+");
                if (plus || token.is(u"||")) {
                    chain = chain || !plus || endsText(previous(i)) || startsText(next(i));
                    if (chain && plus)
                        at(i).text = u"||"_s;
                } else if ((token.part == Part::Symbol && !token.is(u".")) ||
                           (token.part == Part::Word && isClauseWord(token))) {
                    chain = false;
                }
            }
        }
    }

    static bool isClauseWord(const Token& token)
    {
        static const QStringList words{u"SELECT"_s, u"FROM"_s, u"WHERE"_s, u"AND"_s, u"OR"_s,
                                       u"ORDER"_s,  u"AS"_s,   u"LIKE"_s,  u"ON"_s,  u"SET"_s};
        return words.contains(token.text, Qt::CaseInsensitive);
    }

    void writeLimit()
    {
        for (Index i = 0; i < count(); ++i) {
            const Index top = at(i).is(u"SELECT") ? next(i) : none;
            if (!isAt(top, u"TOP") || next(top) == none || at(next(top)).part != Part::Number)
                continue;
            const Index number = next(top);
            const QString limit = u" LIMIT "_s + at(number).text;
            const Index behind = next(number);
            const Index end = endOfSelect(i);
            tokens.insert(end, {Part::Symbol, limit});
            if (behind != none)
                tokens.erase(top, behind);
        }
    }

    /// Returns the end of the SELECT at `i`: the closing parenthesis around it, or the end of the statement.
    Index endOfSelect(Index i)
    {
        int depth = 0;
        for (; i < count(); ++i) {
            if (at(i).is(u"("))
                ++depth;
            else if (at(i).is(u")") && --depth < 0)
                return i;
        }
        return count();
    }

    Tokens tokens;
    std::vector<Translated::Use> uses;
    const Dialect& dialect;
    Schema& schema;
    QList<NamedTable> tables;
};

}  // namespace

QString Translated::text(const QList<QString>& values, const Dialect& dialect) const
{
    QString text = pieces.first();
    for (qsizetype i = 1; i < pieces.size(); ++i) {
        const QString value = values.value(i - 1);
        text += value.startsWith(u'\'') ? written(value, uses[size_t(i - 1)], dialect) : value;
        text += pieces[i];
    }
    return text;
}

Translated translated(const Shape& shape, const Dialect& dialect, Schema& schema)
{
    return Translation(shape, dialect, schema).run();
}

}  // namespace kest::db

#include "platform/database/Tokens.h"

#include "platform/RuntimeError.h"

#include <QStringList>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

bool startsWord(QChar c)
{
    return c.isLetter() || c == u'_' || c == u'@' || c == u'#' || c == u'$';
}

template <class Belongs>
qsizetype endOfRun(const QString& statement, qsizetype start, Belongs&& belongs)
{
    qsizetype end = start + 1;
    while (end < statement.size() && belongs(statement[end]))
        ++end;
    return end;
}

}  // namespace

qsizetype endOfQuoted(const QString& statement, qsizetype start, QChar close)
{
    for (qsizetype i = start + 1; i < statement.size(); ++i) {
        if (statement[i] != close)
            continue;
        if (i + 1 < statement.size() && statement[i + 1] == close)
            ++i;
        else
            return i + 1;
    }
    throw RuntimeError(StatementFailed, u"A quotation mark is not closed in the statement."_s);
}

QString Token::value() const
{
    return text.sliced(1, text.size() - 2).replace(u"''"_s, u"'"_s);
}

Tokens::Tokens(const QString& statement)
{
    static const QStringList pairs{u"<>"_s, u"<="_s, u">="_s, u"!="_s, u"||"_s};
    for (qsizetype i = 0; i < statement.size();) {
        const QChar c = statement[i];
        Part part = Part::Symbol;
        qsizetype end = i + 1;
        if (c.isSpace()) {
            part = Part::Blank;
            end = endOfRun(statement, i, [](QChar next) { return next.isSpace(); });
        } else if (c == u'\'') {
            part = Part::Literal;
            end = endOfQuoted(statement, i, c);
        } else if (c == u'"' || c == u'`' || c == u'[') {
            part = Part::Name;
            end = endOfQuoted(statement, i, c == u'[' ? u']' : c);
        } else if (startsWord(c)) {
            part = Part::Word;
            end = endOfRun(statement, i, [](QChar next) { return startsWord(next) || next.isDigit(); });
        } else if (c.isDigit()) {
            part = Part::Number;
            end = endOfRun(statement, i, [](QChar next) { return next.isLetterOrNumber() || next == u'.'; });
        } else if (pairs.contains(statement.sliced(i, std::min<qsizetype>(2, statement.size() - i)))) {
            end = i + 2;
        }
        tokens.push_back({part, statement.sliced(i, end - i)});
        i = end;
    }
}

Tokens::Index Tokens::next(Index i) const
{
    for (++i; i < count(); ++i) {
        if (at(i).part != Part::Blank)
            return i;
    }
    return none;
}

Tokens::Index Tokens::previous(Index i) const
{
    for (--i; i >= 0; --i) {
        if (at(i).part != Part::Blank)
            return i;
    }
    return none;
}

bool NamedTable::answersTo(QStringView qualifier) const
{
    return qualifier.compare(alias, Qt::CaseInsensitive) == 0 || qualifier.compare(table, Qt::CaseInsensitive) == 0;
}

bool namesTables(const Token& token)
{
    return token.part == Part::Word &&
           (token.is(u"FROM") || token.is(u"JOIN") || token.is(u"INTO") || token.is(u"UPDATE"));
}

QList<NamedTable> tablesAfter(const Tokens& tokens, Tokens::Index keyword)
{
    static const QStringList notAliases{u"WHERE"_s,  u"ORDER"_s,   u"GROUP"_s,  u"INNER"_s,  u"LEFT"_s,
                                        u"RIGHT"_s,  u"FULL"_s,    u"JOIN"_s,   u"ON"_s,     u"USING"_s,
                                        u"SET"_s,    u"VALUES"_s,  u"CROSS"_s,  u"UNION"_s,  u"LIMIT"_s,
                                        u"SELECT"_s, u"DEFAULT"_s, u"HAVING"_s, u"NATURAL"_s};
    QList<NamedTable> tables;
    for (auto i = tokens.next(keyword); i != Tokens::none && tokens.at(i).isIdentifier();) {
        QString table = tokens.at(i).name();
        i = tokens.next(i);
        while (tokens.isAt(i, u".") && tokens.next(i) != Tokens::none) {  // a table of another, unknown schema
            i = tokens.next(i);
            table += u'.' + tokens.at(i).name();
            i = tokens.next(i);
        }
        if (tokens.isAt(i, u"AS"))
            i = tokens.next(i);
        QString alias = table;
        if (i != Tokens::none && tokens.at(i).isIdentifier() &&
            !notAliases.contains(tokens.at(i).text, Qt::CaseInsensitive)) {
            alias = tokens.at(i).name();
            i = tokens.next(i);
        }
        tables.append({table, alias});
        i = tokens.isAt(i, u",") ? tokens.next(i) : Tokens::none;
    }
    return tables;
}

}  // namespace kest::db

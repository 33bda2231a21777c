// Makes up the inputs of tests that state what holds for all of them.
#pragma once

#include "support/Cases.h"

#include <QList>
#include <QMap>
#include <QRandomGenerator>
#include <QRegularExpression>

namespace kest::test {

/// A row of choices. The same seed makes the same choices, so that a failure can be repeated.
class Chance {
public:
    explicit Chance(quint32 seed) : random(seed) {}

    /// Returns a number from `least` to `most`.
    int number(int least, int most) { return random.bounded(least, most + 1); }
    bool once(int in) { return random.bounded(in) == 0; }
    template <class Value = QString>
    Value one(const QList<Value>& of)
    {
        return of[random.bounded(of.size())];
    }

private:
    QRandomGenerator random;
};

/// Makes up texts by the rules of a table in tests/data: a rule's name, and the forms that it may take, which can
/// contain other rules as "{name}".
class Grammar {
public:
    explicit Grammar(const std::string& table)
    {
        for (const QStringList& row : rowsIn(table))
            rules[row[0]] = row.mid(1);
    }
    /// Rules that are nested deeper than `depth` take their first form.
    QString text(Chance& chance, const QString& rule, int depth = 9) const
    {
        static const QRegularExpression name(QStringLiteral("\\{(\\w+)\\}"));
        const QStringList& forms = *rules.find(rule);
        const QString form = depth < 0 ? forms[0] : chance.one(forms);
        QString text;
        qsizetype at = 0;
        for (const QRegularExpressionMatch& part : name.globalMatch(form)) {
            text += form.sliced(at, part.capturedStart() - at) + this->text(chance, part.captured(1), depth - 1);
            at = part.capturedEnd();
        }
        return text + form.sliced(at);
    }

private:
    QMap<QString, QStringList> rules;
};

}  // namespace kest::test

// What the insurer of the loopback transport does: a line-oriented text that a person writes, as rules.
#pragma once

#include <QList>
#include <QMap>
#include <QString>
#include <QStringList>

#include <optional>

namespace kest::app {

/// The `name=value` words of a line.
using Parameters = QMap<QString, QString>;

enum class Act {
    Request,
    Respond,
    Match,
    Authorise,
    Adjust,
    Revise,
    Delete,
    Cancel,
    Reinstate,
    Reject,
    BackOut,
    Waive,
    Manual,
    Marker
};

/// One message that the insurer sends.
struct Step {
    Act act = Act::Respond;
    Parameters parameters;
    int line = 0;  // of the rules, from 1; 0 for a step that no rule wrote
    QString text;  // the line without its comment: `parsedStep` makes the same step of it

    int number(const QString& name, int otherwise = 0) const;
};

enum class Occasion { Start, Quote, Request };

/// What happens on an occasion: steps, each taken once the shop has dealt with the message of the one before.
struct Rule {
    Occasion occasion = Occasion::Start;
    QString number;         // of the quote or request; "*" for any quote
    QString subquote;       // "*" for any supplementary quote
    Parameters parameters;  // hold for all steps
    QList<Step> steps;
    int line = 0;

    /// The steps in words: tells a rule that is done from one that was changed since.
    QString text() const;
};

struct InsurerRules {
    quint32 seed = 1;
    QList<Rule> rules;

    /// The rule for a quote's document: one for that quote, else one for its request, else one for any quote. Where
    /// several stand for the same, the n-th is for the n-th document, and the last for all further ones. Null for none.
    const Rule* ruleFor(const QString& quote, const QString& subquote, const QString& request, int time) const;
};

/// Throws TypeMismatch with every fault of the text on a line of its own, each with its line's number.
InsurerRules parsedRules(const QString& text);
Step parsedStep(const QString& text);

/// A quote's number and subquote out of "1004" or "1004/1"; nothing where the subquote is not one digit.
std::optional<std::pair<QString, QString>> quoteNamed(const QString& reference);

}  // namespace kest::app

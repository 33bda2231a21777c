// The rules of the loopback transport's insurer, read from a text that a person writes, one step on each line.
#pragma once

#include "base/QuoteKey.h"

#include <QList>
#include <QMap>
#include <QString>
#include <QStringList>

#include <optional>

namespace kest::app {

/// The `name=value` words of a line.
using Parameters = QMap<QString, QString>;

/// What a step does.
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

/// A message that the insurer sends.
struct Step {
    Act act = Act::Respond;
    Parameters parameters;
    int line = 0;  // in the rules, from 1; 0 for a step that is not from the rules
    QString text;  // the line without its comment; parsedStep() returns the same step for it

    /// Returns true if its message says which request the quote answers.
    bool namesRequest() const { return act == Act::Request || act == Act::Match || act == Act::Manual; }
    /// Returns a parameter as a number, or `otherwise` if the step does not have it.
    int number(const QString& name, int otherwise = 0) const;
};

/// When the steps of a rule begin.
enum class Occasion { Start, Quote, Request };

/// What happens on an occasion. Each step is taken after the shop has dealt with the message of the step before.
struct Rule {
    Occasion occasion = Occasion::Start;
    QString number;         // of the quote or request; "*" for any quote
    QString subquote;       // "*" for any supplementary quote
    Parameters parameters;  // apply to all steps
    QList<Step> steps;
    int line = 0;

    /// Returns the steps as text. If the text differs, the rule has been changed since it was done.
    QString text() const;
};

/// All rules of an insurer.
struct InsurerRules {
    quint32 seed = 1;
    QList<Rule> rules;

    /// Returns the rule for a quote's document: one for that quote, or else for its request, or else for any quote. If
    /// several rules are for the same, the n-th applies to the n-th document (`time`, from 0) and the last one to all
    /// further documents. Returns null if there is none.
    const Rule* ruleFor(const QuoteKey& quote, const QString& request, int time) const;
};

/// Returns the rules in a text. Throws TypeMismatch with all errors of the text, one on each line with its line number.
InsurerRules parsedRules(const QString& text);
/// Returns the step in a line. Throws TypeMismatch if it is not a step.
Step parsedStep(const QString& text);

/// Returns the quote of "1004" or "1004/1", or nothing if the subquote is not a single digit.
std::optional<QuoteKey> quoteNamed(const QString& reference);

}  // namespace kest::app

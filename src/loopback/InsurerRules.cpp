#include "loopback/InsurerRules.h"

#include "platform/RuntimeError.h"
#include "platform/values.h"

#include <QRegularExpression>

#include <algorithm>
#include <array>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

enum class Needs { Nothing, Quote, Request };

struct ActWord {
    QLatin1StringView word;
    Act act;
    Needs needs;
    QLatin1StringView parameters;
};

constexpr auto forEveryStep = "wait quote request claim network rego"_L1;
constexpr ActWord actWords[] = {
    {"request"_L1, Act::Request, Needs::Nothing,
     "number version vehicle company title firstname surname pictures extra instructions damage"_L1},
    {"respond"_L1, Act::Respond, Needs::Quote, "status"_L1},
    {"match"_L1, Act::Match, Needs::Quote, ""_L1},
    {"authorise"_L1, Act::Authorise, Needs::Quote, "change add delete sublet excess contribution comment assessor"_L1},
    {"adjust"_L1, Act::Adjust, Needs::Quote, "change add delete comment"_L1},
    {"revise"_L1, Act::Revise, Needs::Request, "version reason"_L1},
    {"delete"_L1, Act::Delete, Needs::Quote, "reason"_L1},
    {"cancel"_L1, Act::Cancel, Needs::Request, "reason"_L1},
    {"reinstate"_L1, Act::Reinstate, Needs::Request, ""_L1},
    {"reject"_L1, Act::Reject, Needs::Quote, "reason"_L1},
    {"back-out"_L1, Act::BackOut, Needs::Request, ""_L1},
    {"waive"_L1, Act::Waive, Needs::Quote, ""_L1},
    {"manual"_L1, Act::Manual, Needs::Request, "type vehicle labour parts paint sublet"_L1},
    {"marker"_L1, Act::Marker, Needs::Quote, "action text"_L1},
};

constexpr std::array wholeNumbers{"wait"_L1,   "version"_L1, "pictures"_L1, "change"_L1, "add"_L1,
                                  "delete"_L1, "sublet"_L1,  "labour"_L1,   "parts"_L1,  "paint"_L1};
constexpr int largestNumber = 999;  // limits the numbers of lines, pictures and carries

[[noreturn]] void fail(const QString& why)
{
    throw RuntimeError(TypeMismatch, why);
}

/// Returns the line without its comment and the blanks at its ends. "#" begins a comment if it is not in double quotes.
QString bare(const QString& line)
{
    static const QRegularExpression rule(u"^(?:\"[^\"]*\"|[^\"#]++)*+"_s);
    const QString text = rule.match(line).captured();
    if (line.sliced(text.size()).startsWith(u'"'))
        fail(u"a double quote is not closed"_s);
    return text.trimmed();
}

/// Splits a line into words. Blanks in double quotes belong to the word.
QStringList wordsOf(const QString& line)
{
    static const QRegularExpression word(u"(?:\"[^\"]*\"|[^\\s\"]++)++"_s,
                                         QRegularExpression::UseUnicodePropertiesOption);
    QStringList words;
    for (const QRegularExpressionMatch& match : word.globalMatch(bare(line)))
        words.append(match.captured().remove(u'"'));
    return words;
}

bool lists(QLatin1StringView names, const QString& name)
{
    return QString(names).split(u' ').contains(name);
}

void check(const QString& name, const QString& value)
{
    if (std::find(wholeNumbers.begin(), wholeNumbers.end(), name) != wholeNumbers.end()) {
        bool isNumber = false;
        const int number = value.toInt(&isNumber);
        if (!isNumber || number < 0 || number > largestNumber)
            fail(u"%1 takes a whole number from 0 to %2, not \"%3\""_s.arg(name).arg(largestNumber).arg(value));
    }
    if ((name == "excess"_L1 || name == "contribution"_L1) && !numberIn(value))
        fail(u"%1 takes an amount, not \"%2\""_s.arg(name, value));
    if (name == "extra"_L1 && value != "yes"_L1 && value != "no"_L1)
        fail(u"extra takes yes or no, not \"%1\""_s.arg(value));
    if (name == "quote"_L1 && !quoteNamed(value))
        fail(u"quote takes NUMBER or NUMBER/SUBQUOTE, not \"%1\""_s.arg(value));
}

Parameters parametersIn(const QStringList& words, const QString& owner, QLatin1StringView own)
{
    Parameters parameters;
    for (const QString& word : words) {
        const qsizetype equals = word.indexOf(u'=');
        if (equals < 1)
            fail(u"\"%1\" is not NAME=VALUE"_s.arg(word));
        const QString name = word.first(equals);
        if (!lists(own, name) && !lists(forEveryStep, name))
            fail(u"%1 knows no \"%2\"; it knows %3"_s.arg(
                owner, name, (QString(own) + u' ' + forEveryStep).trimmed().replace(u' ', u", "_s)));
        if (parameters.contains(name))
            fail(u"%1 is given twice"_s.arg(name));
        check(name, word.sliced(equals + 1));
        parameters[name] = word.sliced(equals + 1);
    }
    return parameters;
}

const ActWord& actNamed(const QString& word)
{
    QStringList known;
    for (const ActWord& act : actWords) {
        if (word == act.word)
            return act;
        known.append(act.word);
    }
    fail(u"\"%1\" is not a step; a step is %2"_s.arg(word, known.join(u", "_s)));
}

const ActWord& wordOf(Act act)
{
    return *std::find_if(std::begin(actWords), std::end(actWords), [act](const ActWord& w) { return w.act == act; });
}

/// Reads an occasion from the words after "on".
Rule occasionIn(QStringList words)
{
    Rule rule;
    const QString occasion = words.isEmpty() ? QString() : words.takeFirst();
    if (occasion == "start"_L1) {
        rule.parameters = parametersIn(words, u"on start"_s, {});
        return rule;
    }
    if ((occasion != "quote"_L1 && occasion != "request"_L1) || words.isEmpty())
        fail(
            u"an occasion is: on start, on quote NUMBER[/SUBQUOTE], on quote *, on quote */*, on request NUMBER[/SUBQUOTE]"_s);
    rule.occasion = occasion == "quote"_L1 ? Occasion::Quote : Occasion::Request;
    const QString reference = words.takeFirst();
    const auto named = reference == "*/*"_L1 ? std::optional<QuoteKey>({u"*"_s, u"*"_s}) : quoteNamed(reference);
    if (!named)
        fail(u"\"%1\" is not NUMBER or NUMBER/SUBQUOTE with a subquote of one digit"_s.arg(reference));
    rule.number = named->number;
    rule.subquote = named->subquote;
    if (rule.number == "*"_L1 && rule.occasion == Occasion::Request)
        fail(u"on request takes the number of a request"_s);
    rule.parameters = parametersIn(words, u"on "_s + occasion, {});
    return rule;
}

/// Checks that a step of "on start" names its quote or request: there is none until a step has named it.
void checkTarget(const Rule& rule, const Step& step)
{
    if (rule.occasion != Occasion::Start)
        return;
    const auto told = [&](const QString& name) {
        return step.parameters.contains(name) || rule.parameters.contains(name);
    };
    const bool afterRequest =
        std::any_of(rule.steps.begin(), rule.steps.end(), [](const Step& s) { return s.act == Act::Request; });
    const ActWord& word = wordOf(step.act);
    if (word.needs == Needs::Quote && !told(u"quote"_s))
        fail(u"%1 at the start must say which quote: quote=NUMBER"_s.arg(word.word));
    if (word.needs == Needs::Request && !told(u"request"_s) && !told(u"quote"_s) && !afterRequest)
        fail(u"%1 at the start must say which request: request=NUMBER"_s.arg(word.word));
}

class Parser {
public:
    void take(const QString& line)
    {
        ++number;
        try {
            takeWords(line, wordsOf(line));
        } catch (const RuntimeError& error) {
            faults.append(u"line %1: %2"_s.arg(number).arg(error.description()));
        }
    }

    InsurerRules result;
    QStringList faults;

private:
    void takeWords(const QString& line, const QStringList& words)
    {
        if (words.isEmpty())
            return;
        if (words[0] == "seed"_L1)
            takeSeed(words);
        else if (words[0] == "on"_L1)
            takeOccasion(words.sliced(1));
        else
            takeStep(line);
    }

    void takeSeed(const QStringList& words)
    {
        bool isNumber = words.size() == 2;
        if (isNumber)
            result.seed = words[1].toUInt(&isNumber);
        if (!isNumber)
            fail(u"seed takes one whole number"_s);
    }

    void takeOccasion(const QStringList& words)
    {
        result.rules.append(Rule{});  // even if it is wrong, so that its steps are not reported as misplaced
        result.rules.last().line = number;
        Rule rule = occasionIn(words);
        rule.line = number;
        result.rules.last() = rule;
    }

    void takeStep(const QString& line)
    {
        Step step = parsedStep(line);
        step.line = number;
        if (result.rules.isEmpty())
            fail(u"a step must be below an occasion: on start, on quote NUMBER, ..."_s);
        checkTarget(result.rules.last(), step);
        result.rules.last().steps.append(step);
    }

    int number = 0;
};

}  // namespace

int Step::number(const QString& name, int otherwise) const
{
    const auto found = parameters.find(name);
    return found == parameters.end() ? otherwise : found->toInt();
}

QString Rule::text() const
{
    QStringList lines;
    for (auto parameter = parameters.begin(); parameter != parameters.end(); ++parameter)
        lines.append(parameter.key() + u'=' + parameter.value());
    for (const Step& step : steps)
        lines.append(step.text);
    return lines.join(u'\n');
}

const Rule* InsurerRules::ruleFor(const QuoteKey& quote, const QString& request, int time) const
{
    const auto nth = [&](auto&& fits) {
        const Rule* found = nullptr;
        int seen = 0;
        for (const Rule& rule : rules)
            if (seen < time && fits(rule)) {
                found = &rule;
                ++seen;
            }
        return found;
    };
    const auto same = [](const QString& a, const QString& b) { return a.compare(b, Qt::CaseInsensitive) == 0; };
    const QString any = quote.isMain() ? u"0"_s : u"*"_s;
    if (const Rule* rule = nth([&](const Rule& r) {
            return r.occasion == Occasion::Quote && same(r.number, quote.number) && r.subquote == quote.subquote;
        }))
        return rule;
    if (const Rule* rule = nth([&](const Rule& r) {
            return r.occasion == Occasion::Request && same(r.number, request) && r.subquote == quote.subquote;
        }))
        return rule;
    return nth([&](const Rule& r) { return r.occasion == Occasion::Quote && r.number == "*"_L1 && r.subquote == any; });
}

Step parsedStep(const QString& text)
{
    Step step;
    step.text = bare(text);
    QStringList words = wordsOf(step.text);
    const ActWord& word = actNamed(words.isEmpty() ? QString() : words.takeFirst());
    step.act = word.act;
    step.parameters = parametersIn(words, word.word, word.parameters);
    return step;
}

InsurerRules parsedRules(const QString& text)
{
    Parser parser;
    for (const QString& line : text.split(u'\n'))
        parser.take(line);
    if (!parser.faults.isEmpty())
        fail(parser.faults.join(u'\n'));
    return parser.result;
}

std::optional<QuoteKey> quoteNamed(const QString& reference)
{
    const QString number = reference.section(u'/', 0, 0);
    const QString subquote = reference.contains(u'/') ? reference.section(u'/', 1) : u"0"_s;
    if (number.isEmpty() || subquote.size() != 1 || !subquote[0].isDigit())
        return {};
    return QuoteKey{number, subquote};
}

}  // namespace kest::app

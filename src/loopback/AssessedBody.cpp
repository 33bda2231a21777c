#include "loopback/AssessedBody.h"

#include "loopback/AuthorityDocument.h"
#include "platform/values.h"
#include "quotedata/Rounding.h"

#include <algorithm>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

struct Work {
    QString labour;
    QString part;
    QString partNumber;
    double price;
};

const QList<Work>& works()
{
    static const QList<Work> all{{u"L/H front guard liner"_s, u"L/H guard liner"_s, u"53876-C1200"_s, 84},
                                 {u"Radiator support panel"_s, u"Radiator support panel"_s, u"53201-T3200"_s, 212.5},
                                 {u"R/H rear door"_s, u"R/H rear door mould"_s, u"75741-K4100"_s, 61.4},
                                 {u"Bonnet and latch"_s, u"Bonnet latch"_s, u"53510-H2100"_s, 96},
                                 {u"Rear beaver panel"_s, u"Number plate lamp"_s, u"81270-Y6100"_s, 28.75}};
    return all;
}

struct SubletWork {
    QString type;
    QString description;
    QString repairer;
    QString address;
    QString phone;
};

const QList<SubletWork>& subletWorks()
{
    static const QList<SubletWork> all{
        {u"ELEC"_s, u"Aim headlamps and clear fault codes"_s, u"Lantern & Loom Auto Electrics"_s, u"12 Depot Street"_s,
         u"03 5550 0063"_s},
        {u"WHAL"_s, u"Four wheel alignment"_s, u"Straightline Alignment"_s, u"8 Foundry Lane"_s, u"03 5550 0035"_s},
        {u"GLAS"_s, u"Replace windscreen"_s, u"Clearview Glass"_s, u"17 Ferry Street"_s, u"03 5550 0037"_s}};
    return all;
}

double amount(const Parameters& values, const QString& name)
{
    return numberIn(values.value(name)).value_or(0);
}

QString money(double value)
{
    return numberText(RoundAmount(double(value), 2));
}

void setPart(Parameters& part, double price)
{
    const double parts = RoundAmount(price * amount(part, u"partQuantity"_s), 2);
    part[u"partUnitPrice"_s] = money(price);
    part[u"partAmount"_s] = money(parts);
    part[u"partMarkUpAmount"_s] = money(parts * amount(part, u"partMarkUpPercentage"_s) / 100);
}

/// Reduces the amount of a line a little.
void lower(int section, Parameters& values)
{
    if (section == Labours)
        values[u"labourAmount"_s] = money(amount(values, u"labourAmount"_s) * 0.85);
    else if (section == Paints)
        values[u"paintAmount"_s] = money(amount(values, u"paintAmount"_s) * 0.9);
    else
        setPart(values, amount(values, u"partUnitPrice"_s) * 0.9);
}

BodyLine lineOf(int section, int number, Dice& dice)
{
    const Work& work = dice.of(works());
    BodyLine line{{}, number, {}};
    if (section == Labours) {
        line.values = {{u"labourType"_s, dice.of(std::array{u"RR"_s, u"REPR"_s})},
                       {u"labourDescription"_s, work.labour},
                       {u"labourAmount"_s, money(30 + 4.2 * dice.below(20))}};
    } else if (section == Paints) {
        line.values = {{u"paintWorkType"_s, u"PAIN"_s},
                       {u"paintDescription"_s, work.labour},
                       {u"paintAmount"_s, money(40 + 4.4 * dice.below(20))}};
    } else if (section == Parts) {
        line.values = {{u"partNumber"_s, work.partNumber},
                       {u"partType"_s, u"NEW"_s},
                       {u"partDescription"_s, work.part},
                       {u"partQuantity"_s, u"1"_s},
                       {u"partMarkUpPercentage"_s, u"25"_s}};
        setPart(line.values, work.price);
    } else {
        const SubletWork& sublet = dice.of(subletWorks());
        line.values = {{u"subletType"_s, sublet.type},
                       {u"subletDescription"_s, sublet.description},
                       {u"subletRepairer"_s, sublet.repairer},
                       {u"subletRepairerAddress"_s, sublet.address},
                       {u"subletRepairerPhone"_s, sublet.phone}};
    }
    return line;
}

void authorise(BodyLine& sublet, const QString& reference)
{
    const QString authority = u"SA%1"_s.arg(9000 + sublet.number);
    sublet.values[u"subletAuthorityNumber"_s] = authority;
    const QByteArray document =
        authorityDocument({u"Sublet authority "_s + authority, u"Quote %1, line %2"_s.arg(reference).arg(sublet.number),
                           sublet.values.value(u"subletDescription"_s), sublet.values.value(u"subletRepairer"_s)});
    sublet.values[u"subletAuthorityDocument"_s] = QString::fromLatin1(document.toBase64());
}

/// Returns all lines in random order, without the sublets, whose amounts an insurer does not change.
QList<std::pair<int, BodyLine*>> changeable(AssessedBody& body, Dice& dice)
{
    QList<std::pair<int, BodyLine*>> lines;
    for (const int section : {Labours, Paints, Parts})
        for (BodyLine& line : body.lines[section])
            lines.append({section, &line});
    for (qsizetype left = lines.size(); left > 1; --left)
        lines.swapItemsAt(left - 1, dice.below(left));
    return lines;
}

void writeLine(const Branch& section, const BodySection& kind, const BodyLine& line)
{
    const Branch branch = section.add(kind.line);
    if (!line.indicator.isEmpty())
        branch.add("quoteLineChangeIndicator", line.indicator);
    branch.add("quoteLineNumber", QString::number(line.number));
    if (line.indicator == "D"_L1)
        return;
    for (const char* element : kind.elements) {
        const auto value = line.values.find(QLatin1StringView(element));
        if (value != line.values.end())
            branch.add(element, *value);
    }
}

double sum(const QList<BodyLine>& lines, const QString& name)
{
    double result = 0;
    for (const BodyLine& line : lines)
        if (line.indicator != "D"_L1)
            result += amount(line.values, name);
    return RoundAmount(result, 2);
}

struct Totals {
    explicit Totals(const AssessedBody& body)
        : labour(sum(body.lines[Labours], u"labourAmount"_s)),
          paint(sum(body.lines[Paints], u"paintAmount"_s)),
          parts(sum(body.lines[Parts], u"partAmount"_s)),
          markUp(sum(body.lines[Parts], u"partMarkUpAmount"_s)),
          tax(RoundAmount((labour + paint + parts + markUp) * 0.1, 2)),
          whole(RoundAmount(labour + paint + parts + markUp + tax, 2))
    {
    }

    double labour, paint, parts, markUp, tax, whole;
};

}  // namespace

double AssessedBody::total() const
{
    return Totals(*this).whole;
}

void AssessedBody::writeTo(const Branch& body) const
{
    const auto section = [&](int index) {
        const BodySection& kind = bodySections()[index];
        const Branch branch = body.add(kind.name);
        for (const BodyLine& line : lines[index])
            writeLine(branch, kind, line);
    };
    const Totals totals(*this);
    body.add("quoteReference", reference);
    body.add("quoteType", type);
    section(Labours);
    body.add("labourTotal", numberText(totals.labour));
    section(Paints);
    body.add("paintTotal", numberText(totals.paint));
    section(Parts);
    body.add({{"partTotal", always, numberText(totals.parts)},
              {"partMarkUpTotal", always, numberText(totals.markUp)},
              {"gst", always, numberText(totals.tax)},
              {"quoteTotal", always, numberText(totals.whole)},
              {"reports", always, {}}});
    section(Sublets);
}

AssessedBody sameBody(const QuoteDocument& quote)
{
    AssessedBody body{quote.key.fullReference(), quote.type, {}};
    std::copy(std::begin(quote.lines), std::end(quote.lines), body.lines);
    return body;
}

AssessedBody assessedBody(const QuoteDocument& quote, const Changes& changes, Dice& dice)
{
    AssessedBody body = sameBody(quote);
    for (QList<BodyLine>& section : body.lines)
        for (BodyLine& line : section)
            line.indicator = u"N"_s;

    int index = 0;
    for (const auto& [section, line] : changeable(body, dice)) {
        if (index < changes.remove)
            *line = {u"D"_s, line->number, {}};
        else if (index < changes.remove + changes.change) {
            line->indicator = u"C"_s;
            lower(section, line->values);
        }
        ++index;
    }

    int number = quote.highestLine / 100 * 100 + 100;
    const auto insert = [&](int section) -> BodyLine& {
        body.lines[section].append(lineOf(section, ++number, dice));
        body.lines[section].last().indicator = u"I"_s;
        return body.lines[section].last();
    };
    for (int added = 0; added < changes.add; ++added)
        insert(added % Sublets);
    for (int added = 0; added < changes.sublets; ++added)
        authorise(insert(Sublets), body.reference);
    return body;
}

AssessedBody manualBody(const QString& reference, const QString& type, const int (&counts)[SectionCount], Dice& dice)
{
    AssessedBody body{reference, type, {}};
    int number = 0;
    for (int section = 0; section < SectionCount; ++section)
        for (int line = 0; line < counts[section]; ++line)
            body.lines[section].append(lineOf(section, ++number, dice));
    return body;
}

}  // namespace kest::app

#include "quotedata/NetworkCodes.h"

#include "base/Helpers.h"

#include <algorithm>
#include <span>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

/// The network's code and the shop's word. If several pairs have the same code, the first one is used for the code.
struct Pair {
    QLatin1StringView code;
    QLatin1StringView ours;
};

constexpr Pair colours[] = {
    {"AQUA"_L1, "Aqua"_L1},   {"BEIG"_L1, "Beige"_L1},     {"BLAK"_L1, "Black"_L1},  {"BLUE"_L1, "Blue"_L1},
    {"BROW"_L1, "Brown"_L1},  {"CHAM"_L1, "Champagne"_L1}, {"GOLD"_L1, "Gold"_L1},   {"GREN"_L1, "Green"_L1},
    {"GREY"_L1, "Grey"_L1},   {"MARN"_L1, "Maroon"_L1},    {"ORAG"_L1, "Orange"_L1}, {"PINK"_L1, "Pink"_L1},
    {"PURP"_L1, "Purple"_L1}, {"RED"_L1, "Red"_L1},        {"SILV"_L1, "Silver"_L1}, {"WHIT"_L1, "White"_L1},
    {"YELW"_L1, "Yellow"_L1},
};

constexpr Pair paintGroups[] = {
    {"SOLD"_L1, "S1"_L1}, {"CLER"_L1, "S2"_L1}, {"CLER"_L1, "S3"_L1},
    {"META"_L1, "M1"_L1}, {"PEAR"_L1, "M2"_L1}, {"HARL"_L1, "M3"_L1},
};

constexpr Pair partTypes[] = {
    {"NEW"_L1, " "_L1},  {"RECY"_L1, "U"_L1}, {"RECY"_L1, "A"_L1},
    {"RECY"_L1, "C"_L1}, {"RECY"_L1, "R"_L1}, {"EXCH"_L1, "X"_L1},
};

constexpr Pair transmissions[] = {{"A"_L1, "Automatic"_L1}, {"M"_L1, "Manual"_L1}};

constexpr LabourType labourTypes[] = {labour::removeAndReplace, labour::repair, labour::other};

struct Reason {
    Pair pair;
    bool isReported = true;
};

constexpr Reason reasons[] = {
    {{"UNSP"_L1, "Unspecified Reason"_L1}},
    {{"INCO"_L1, "Quote Incomplete"_L1}},
    {{"LABR"_L1, "Labour Price"_L1}},
    {{"PART"_L1, "Part Price"_L1}},
    {{"PAIN"_L1, "Paint Price"_L1}},
    {{"RECY"_L1, "Recycled Parts"_L1}},
    {{"METH"_L1, "Method of Repair"_L1}},
    {{"TLSS"_L1, "Total Loss"_L1}, false},
    {{"NOTP"_L1, "Repair not Proceeding"_L1}, false},
};

std::optional<QString> oursOf(const QString& code, std::span<const Pair> pairs)
{
    const auto found = std::ranges::find(pairs, code, &Pair::code);
    return found == pairs.end() ? std::nullopt : std::optional<QString>(found->ours);
}

std::optional<QString> codeOf(const QString& ours, std::span<const Pair> pairs)
{
    const auto found = std::ranges::find(pairs, ours, &Pair::ours);
    return found == pairs.end() ? std::nullopt : std::optional<QString>(found->code);
}

const Reason* findReason(const QString& code)
{
    const auto found =
        std::ranges::find(reasons, code.toUpper(), [](const Reason& reason) { return reason.pair.code; });
    return found == std::end(reasons) ? nullptr : found;
}

}  // namespace

std::optional<QString> colourOfCode(const QString& code)
{
    return oursOf(code.toUpper(), colours);
}

QString codeOfColour(const QString& colour)
{
    const QString lower = colour.trimmed().toLower();
    for (const auto& [code, name] : colours)
        if (lower == QString(name).toLower())
            return code;
    return lower;
}

QString paintGroupOfCode(const QString& code)
{
    return oursOf(code, paintGroups).value_or(u"S3"_s);
}

QString codeOfPaintGroup(const QString& group)
{
    return codeOf(group.toUpper(), paintGroups).value_or(QString());
}

std::optional<QString> markOfPartType(const QString& type)
{
    return oursOf(type, partTypes);
}

QString partTypeOfMark(const QString& mark)
{
    return codeOf(mark, partTypes).value_or(u"NEW"_s);
}

const LabourType* labourTypeOfCode(const QString& code)
{
    const auto found = std::ranges::find(labourTypes, code, &LabourType::code);
    return found == std::end(labourTypes) ? nullptr : found;
}

const LabourType& labourTypeOfCategory(const QString& category)
{
    const auto found = std::ranges::find(labourTypes, category, &LabourType::category);
    return found == std::end(labourTypes) ? labour::other : *found;
}

QString transmissionOfCode(const QString& code)
{
    return oursOf(code, transmissions).value_or(code);
}

QString transmissionToSend(const QString& transmission)
{
    const QString letterOrWord = transmission.trimmed().toUpper();
    for (const auto& [letter, word] : transmissions)
        if (letterOrWord == letter || letterOrWord == QString(word).toUpper())
            return word;
    return u"Manual"_s;
}

std::optional<QString> reasonOfCode(const QString& code)
{
    const Reason* reason = findReason(code);
    return reason ? std::optional<QString>(reason->pair.ours) : std::nullopt;
}

std::optional<QString> reportedReasonOfCode(const QString& code)
{
    const Reason* reason = findReason(code);
    return reason && reason->isReported ? std::optional<QString>(reason->pair.ours) : std::nullopt;
}

QString buildDate(qint64 year, qint64 month)
{
    if (year <= 0)
        return u""_s;
    return PadZeroLeft(QString::number(month == 0 ? 1 : month), 2) + u'/' + QString::number(year);
}

std::pair<QString, QString> monthAndYearTyped(const QString& date)
{
    const qsizetype slash = date.indexOf(u'/');
    if (slash >= 0)
        return {date.left(slash), date.mid(slash + 1)};
    if (date.size() > 3)
        return {u"01"_s, date};
    return {};
}

std::pair<QString, QString> monthAndYearWritten(const QString& date)
{
    if (date.size() == 7)
        return {date.left(2).trimmed(), date.right(4).trimmed()};
    return {QString(), date.size() == 4 ? date : QString()};
}

}  // namespace kest

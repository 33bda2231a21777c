// The codes of the network and what the shop writes for them: one table each, read in both directions.
#pragma once

#include <QString>

#include <optional>
#include <utility>

namespace kest {

/// "White" for "WHIT", in any case.
std::optional<QString> colourOfCode(const QString& code);
/// "WHIT" for " white". A colour without a code is sent as it is, in lower case.
QString codeOfColour(const QString& colour);

/// The paint group of a car for a network's paint type; "S3" for an unknown one.
QString paintGroupOfCode(const QString& code);
/// The paint type of a group in any case; empty for an unknown one. "S3" is sent as "CLER", which comes back as "S2".
QString codeOfPaintGroup(const QString& group);

/// The mark of a part line for a network's part type: a blank for a new part.
std::optional<QString> markOfPartType(const QString& type);
/// The part type of a mark; "NEW" for an unknown one.
QString partTypeOfMark(const QString& mark);

struct LabourType {
    QLatin1StringView code;
    QLatin1StringView category;
    QLatin1StringView amountColumn;  // of a line that the network has sent; its rate is then 1
};
namespace labour {
using Qt::Literals::StringLiterals::operator""_L1;
inline constexpr LabourType removeAndReplace{"RR"_L1, "R&R"_L1, "rrhour"_L1};
inline constexpr LabourType repair{"REPR"_L1, "RA"_L1, "rahour"_L1};
inline constexpr LabourType other{"OTH"_L1, "MIS"_L1, "unitcost"_L1};  // also what mechanical work is sent as
}  // namespace labour
/// Null for an unknown code.
const LabourType* labourTypeOfCode(const QString& code);
/// `labour::other` for every category that has no type of its own.
const LabourType& labourTypeOfCategory(const QString& category);

/// "Automatic" for the network's "A", "Manual" for "M"; any other text as it is.
QString transmissionOfCode(const QString& code);
/// "Automatic" or "Manual", the words that are sent, for what a car has: the letter or the word in any case. What is
/// neither counts as manual.
QString transmissionToSend(const QString& transmission);

/// Why the insurer has rejected a quote: the text for a code in any case.
std::optional<QString> reasonOfCode(const QString& code);
/// The same for the report of an assessment result, which leaves the two reasons open that end a repair.
std::optional<QString> reportedReasonOfCode(const QString& code);

/// A car's build date: "03/1998", with a month of 0 "01/1998"; empty for a year of 0 or less.
QString buildDate(qint64 year, qint64 month);
/// Month and year of a build date as a person may have typed it: around its "/", or "01" and a year alone.
std::pair<QString, QString> monthAndYearTyped(const QString& date);
/// Month and year of a build date in the form that the host writes, "03/1998" or "1998"; empty for any other.
std::pair<QString, QString> monthAndYearWritten(const QString& date);

}  // namespace kest

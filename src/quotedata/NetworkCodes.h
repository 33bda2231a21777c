// Converts between the codes of the network and the words of the shop. Each table is read in both directions.
#pragma once

#include <QString>

#include <optional>
#include <utility>

namespace kest {

/// Returns "White" for "WHIT", in any case, or nothing for an unknown code.
std::optional<QString> colourOfCode(const QString& code);
/// Returns "WHIT" for " white". A colour without a code is returned in lower case, as it is sent.
QString codeOfColour(const QString& colour);

/// Returns the paint group for the network's paint type, or "S3" for an unknown one.
QString paintGroupOfCode(const QString& code);
/// Returns the paint type of a group, in any case, or an empty text for an unknown one. "S3" is sent as "CLER", which
/// is read as "S2".
QString codeOfPaintGroup(const QString& group);

/// Returns the mark of a part line for the network's part type. A new part has a blank.
std::optional<QString> markOfPartType(const QString& type);
/// Returns the part type of a mark, or "NEW" for an unknown one.
QString partTypeOfMark(const QString& mark);

/// A kind of labour.
struct LabourType {
    QLatin1StringView code;
    QLatin1StringView category;
    QLatin1StringView amountColumn;  // contains the amount of a line from the network, whose rate is 1
};
namespace labour {
using Qt::Literals::StringLiterals::operator""_L1;
inline constexpr LabourType removeAndReplace{"RR"_L1, "R&R"_L1, "rrhour"_L1};
inline constexpr LabourType repair{"REPR"_L1, "RA"_L1, "rahour"_L1};
inline constexpr LabourType other{"OTH"_L1, "MIS"_L1, "unitcost"_L1};  // mechanical work is sent as this, too
}  // namespace labour
/// Returns the labour type of a code, or null for an unknown code.
const LabourType* labourTypeOfCode(const QString& code);
/// Returns the labour type of a category, or `labour::other` if it has none of its own.
const LabourType& labourTypeOfCategory(const QString& category);

/// Returns "Automatic" for the network's "A" and "Manual" for "M". Any other text stays as it is.
QString transmissionOfCode(const QString& code);
/// Returns "Automatic" or "Manual", the words that are sent, for the letter or word of a car in any case. Any other
/// text counts as manual.
QString transmissionToSend(const QString& transmission);

/// Returns why the insurer has rejected a quote. The code may be in any case.
std::optional<QString> reasonOfCode(const QString& code);
/// Returns the reason for the report of an assessment result, which does not show the two reasons that end a repair.
std::optional<QString> reportedReasonOfCode(const QString& code);

/// Returns a car's build date such as "03/1998". A month of 0 becomes "01"; for a year of 0 or less the text is empty.
QString buildDate(qint64 year, qint64 month);
/// Returns the month and year of a build date that a person has typed: the parts around the "/", or "01" and the year.
std::pair<QString, QString> monthAndYearTyped(const QString& date);
/// Returns the month and year of a build date in the form of the host, "03/1998" or "1998". Both are empty for any
/// other text.
std::pair<QString, QString> monthAndYearWritten(const QString& date);

}  // namespace kest

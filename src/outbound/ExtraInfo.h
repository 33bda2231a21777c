// The extra vehicle information of a quote: read from the quote and its car, and stored there again.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <QString>

#include <array>
#include <variant>

namespace kest {

enum ExtraValue : size_t {
    Transmission,  // "Automatic" or "Manual"
    VIN,
    Odometer,
    Cylinders,
    Fuel,  // percent
    DamageDesc,
    OldDamageDesc,
    BuildMonth,
    BuildYear,
    Colour,
};
using ExtraValues = std::array<QString, 10>;

/// "Automatic" or "Manual", from the letter or the word that the car has.
QString transmissionOf(const db::Recordset& car);

/// The values, or the message that says which record is missing.
using ExtraInfoResult = std::variant<ExtraValues, QString>;

/// The records behind the values, held open from the reading to the saving.
class ExtraInfo {
public:
    /// Reads everything of one quote. Where a record is missing `problem` says so, and nothing else may be asked.
    explicit ExtraInfo(const QuoteKey& key);

    const QString& problem() const { return missing; }

    /// What identifies the quote to a person.
    QString quoteNumber() const;
    QString customer() const;
    QString rego() const;
    QString model() const;

    /// Fuel and damage are asked anew each time and start empty.
    ExtraValues values() const;

    /// Stores the values in the car and the quote. The car's transmission, build date and colour always take their
    /// normal form; an empty VIN, odometer or cylinder number changes nothing.
    void save(const ExtraValues& values);

private:
    db::Recordset quoteRow;
    db::Recordset carRow;
    db::Recordset modelRow;
    db::Recordset customerRow;
    QString missing;
};

/// The values as the tables hold them, saved in their normal forms, without asking anyone.
ExtraInfoResult BuildArrayFromDB(const QString& quoteNumber, const QString& subquote);

}  // namespace kest

// Reads and stores the extra vehicle information of a quote, which is part of the quote's and the car's records.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <QString>

#include <variant>

namespace kest {

/// The values of the dialog, as text.
struct ExtraValues {
    QString transmission;  // "Automatic" or "Manual"
    QString vin;
    QString odometer;
    QString cylinders;
    QString fuel;  // percent
    QString damage;
    QString oldDamage;
    QString buildMonth;
    QString buildYear;
    QString colour;
};

/// The values, or a message that says which record is missing.
using ExtraInfoResult = std::variant<ExtraValues, QString>;

/// The records of the values. They stay open until the values are saved.
class ExtraInfo {
public:
    /// Reads the records of a quote. If one is missing, problem() says which, and no other function may be called.
    explicit ExtraInfo(const QuoteKey& key);

    const QString& problem() const { return missing; }

    // What the dialog shows to identify the quote.
    QString quoteNumber() const;
    QString customer() const;
    QString rego() const;
    QString model() const;

    // The size of the columns in characters. 0 if it is not limited.
    int longestVin() const { return carRow.size(QStringLiteral("VIN")); }
    int longestOdometer() const { return quoteRow.size(QStringLiteral("kms")); }
    int longestMonthAndYear() const { return carRow.size(QStringLiteral("Year")); }  // with the "/" between them

    /// Returns the stored values. Fuel and damage are empty, because they are asked for each time.
    ExtraValues values() const;

    /// Stores the values in the car and the quote. Always writes transmission, build date and colour, in their normal
    /// forms. An empty VIN, odometer or number of cylinders changes nothing.
    void save(const ExtraValues& values);

private:
    db::Recordset quoteRow;
    db::Recordset carRow;
    db::Recordset modelRow;
    db::Recordset customerRow;
    QString missing;
};

/// Returns the stored values without showing the dialog, after saving them in their normal forms.
ExtraInfoResult BuildArrayFromDB(const QString& quoteNumber, const QString& subquote);

}  // namespace kest

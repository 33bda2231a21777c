// Converts addresses and build dates to the forms that JobLink expects.
#pragma once

#include <QString>
#include <QVariant>

namespace kest::joblink {

/// Returns street and suburb on one line, without the postcode at the end of the suburb.
QString composedAddress(const QString& street, const QString& suburb);
/// Returns the number at the end of a suburb of several words, or an empty text if there is none.
QString postcode(const QString& suburb);

/// The month and year in which a car was built.
struct BuildDate {
    QVariant month;  // Null if it is unknown
    QVariant year;
};
/// Reads "MM/YYYY" or "YYYY". Both values are Null if the text is Null or empty.
BuildDate buildDate(const QVariant& year);

}  // namespace kest::joblink

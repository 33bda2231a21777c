// How JobLink wants an address and a build date.
#pragma once

#include <QString>
#include <QVariant>

namespace kest::joblink {

/// Street and suburb on one line, without the postcode that may end the suburb.
QString composedAddress(const QString& street, const QString& suburb);
/// The number that ends a suburb of several words; empty where there is none.
QString postcode(const QString& suburb);

struct BuildDate {
    QVariant month;  // Null where the text holds none
    QVariant year;
};
/// Reads "MM/YYYY" or "YYYY"; a Null or empty text gives two Nulls.
BuildDate buildDate(const QVariant& year);

}  // namespace kest::joblink

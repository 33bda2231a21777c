// The photographs of a quote: which files they are, their ids, and their documents in the outgoing folder.
#pragma once

#include "base/QuoteKey.h"

#include <QList>
#include <QString>

namespace kest {

struct QuoteImage {
    QString file;
    QString id;
};

/// The images of a quote in a folder, in the order of their names. A name from which no id can be read is no image of
/// the quote, in the quote document and in the image documents alike.
QList<QuoteImage> quoteImages(const QString& folder, const QuoteKey& quote);

/// The number behind a name's first underscore, without leading zeros: 123_0012.jpg gives 12. Empty where none stands.
QString imageId(const QString& file);

/// Puts a document and a copy of each image into the outgoing folder.
void writeImageDocuments(const QString& folder, const QuoteKey& quote);

}  // namespace kest

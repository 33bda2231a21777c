// Finds the photographs of a quote and writes their documents to the outgoing folder.
#pragma once

#include "base/QuoteKey.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest {

/// A photograph: the name of its file and the id in it.
struct QuoteImage {
    QString file;
    QString id;
};

/// Returns the images of a quote in the order of their names. A file without a readable id is not an image of the
/// quote, neither for the quote document nor for the image documents.
QList<QuoteImage> quoteImages(const QString& folder, const QuoteKey& quote);

/// Returns the number after the first underscore of a name without leading zeros, such as "12" for 123_0012.jpg, or an
/// empty text if there is none.
QString imageId(const QString& file);

/// Writes a document and a copy of each image to the outgoing folder: of those that the quote's document counts, if a
/// send is at work. Leaves out those that it has written before it was interrupted. Returns the names of images that
/// are gone. Throws PathNotFound if there are images to write and their folder is away, or empty as the place of a
/// share that is not mounted.
QStringList writeImageDocuments(const QString& folder, const QuoteKey& quote);

}  // namespace kest

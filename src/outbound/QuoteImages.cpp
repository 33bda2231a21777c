#include "outbound/QuoteImages.h"

#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "platform/RuntimeError.h"
#include "platform/Waiting.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "platform/xml/Branch.h"

#include <QJsonArray>
#include <QSet>

#include <cmath>

using namespace Qt::StringLiterals;

namespace kest {

QList<QuoteImage> quoteImages(const QString& folder, const QuoteKey& quote)
{
    const QString stem = quote.number + u'_' + quote.subquote;
    QList<QuoteImage> images;
    if (!files::folderExists(folder))
        return images;
    for (const QString& file : files::list(folder, stem + u"*.jpg"_s)) {
        const QString id = imageId(file);
        if (file.startsWith(stem, Qt::CaseInsensitive) && !id.isEmpty())  // not a pattern: a number may contain "*"
            images.append({file, id});
    }
    return images;
}

QString imageId(const QString& file)
{
    const QString name = file.trimmed();
    const qsizetype behindUnderscore = name.indexOf(u'_') + 1;
    // as many characters as the extension has: "0012", or "0012." with ".jpeg"
    const qsizetype length = name.size() - name.indexOf(u'.');
    const std::optional<double> number = numberIn(name.mid(behindUnderscore, length));
    return number ? numberText(std::trunc(*number)) : QString();
}

/// Returns the images that the document of the send at work counts.
static QList<QuoteImage> countedImages(const QString& folder, const QuoteKey& quote)
{
    const QJsonValue names = journal::kept(u"document"_s)[u"images"_s];
    if (names.isUndefined())
        return quoteImages(folder, quote);
    QList<QuoteImage> images;
    for (const QJsonValue name : names.toArray())
        images.append({name.toString(), imageId(name.toString())});
    return images;
}

QStringList writeImageDocuments(const QString& folder, const QuoteKey& quote)
{
    QStringList gone;
    const QList<QuoteImage> images = countedImages(folder, quote);
    if (images.isEmpty())
        return gone;
    QSet<QString> waiting;  // with their case folded
    for (const QString& name : files::list(gsUnsentPath, u"I_"_s + quote.number + u'*'))
        waiting.insert(name.toCaseFolded());
    const auto target = [&](const QString& name) {
        return waiting.contains(name.toCaseFolded()) ? files::Target::Unknown : files::Target::Free;
    };
    for (const QuoteImage& image : images) {
        workStep();
        if (journal::kept(image.file).toBool())
            continue;
        const QString picture = files::pathForWriting(folder, image.file);
        if (!files::exists(picture)) {
            if (files::list(folder).isEmpty())  // it may be the place of a share that is not mounted
                throw RuntimeError(PathNotFound, u"The pictures' folder %1 was not found, or is empty."_s.arg(folder));
            gone.append(image.file);
            continue;
        }
        xml::Document document;
        const Branch request(document, "request");
        request.add({
            {"kestQuoteNumber", always, quote.fullReference()},
            {"quoteImageId", always, image.id},
            {"imageType", always, u"JPEG"_s},
            {"imageDescription", always, {}},
        });
        const QString name = u"I_"_s + image.file;
        const QString documentName = name.chopped(3) + u"xml"_s;
        files::write(gsUnsentPath + documentName, request.xml(), target(documentName));
        files::copy(picture, gsUnsentPath + name, target(name));
        journal::keep(image.file, true);
    }
    return gone;
}

}  // namespace kest

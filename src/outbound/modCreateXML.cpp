#include "outbound/modCreateXML.h"

#include "base/Journal.h"
#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "messages/Envelope.h"
#include "outbound/QuoteBody.h"
#include "outbound/QuoteHead.h"
#include "outbound/QuoteImages.h"
#include "outbound/frmExtraInfo.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "quotedata/Quote.h"
#include "quotedata/StateTable.h"

#include <QJsonArray>
#include <QJsonObject>
#include <QSet>

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr int highestFileNumber = 9999;

/// Returns the name of the quote's next document. Counts only the documents that the transport has sent, so a document
/// that is still waiting is replaced.
QString documentName(const QuoteRows& rows)
{
    const QString stem = rows.key.filePrefix();
    QSet<QString> sent;
    if (files::folderExists(gsSentPath))
        for (const QString& name : files::list(gsSentPath, stem + u"*.xml"_s))
            sent.insert(name.toUpper());
    for (int n = 1; n <= highestFileNumber; ++n) {
        const QString name = stem + QString::number(n) + u".xml"_s;
        if (!sent.contains(name.toUpper()))
            return name;
    }
    throw RuntimeError(FileExists, u"All %1 documents of quote %2 have been sent, there is no name for another one."_s
                                       .arg(highestFileNumber)
                                       .arg(rows.key.fullReference()));
}

/// Returns the text between the tags of the root element. The transport adds a root of its own.
QString withoutRoot(const QString& text)
{
    const qsizetype behindRoot = text.indexOf(u'>') + 1;
    return text.mid(behindRoot, text.size() - behindRoot - u"</request>"_s.size());
}

/// Returns the names of the pictures that the document counts.
QStringList addImages(const Branch& request, const QuoteRows& rows)
{
    const QString folder = GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"ImagesPath"_s, u"c:\\wirimg\\"_s);
    if (!files::folderExists(folder)) {
        const QString lost = u"The pictures' folder %1 was not found, so quote %2 is sent without pictures."_s.arg(
            folder, rows.key.reference());
        attempt([&] { logFailure(RuntimeError(PathNotFound, lost), u"modCreateXML.addImages"_s); });
        desktop::msgBox(lost + u" Check the drive, and send the pictures to the insurer in another way."_s,
                        desktop::Icon::Exclamation);
    }
    const QList<QuoteImage> images = quoteImages(folder, rows.key);
    request.add("imageCount", QString::number(images.size()));
    if (images.isEmpty())
        return {};
    QStringList names;
    const Branch ids = request.add("quoteImageIds");
    for (const QuoteImage& image : images) {
        ids.add("quoteImageId", image.id);
        names.append(image.file);
    }
    return names;
}

const QString submitted = u"Submitted"_s;
const QString sentStage = QString::number(*quoteSent.stage);

QString quoteStatus(const db::Recordset& notes)
{
    return GetNoteStatus(u"KEST Quote"_s, text(notes, "remarks"));
}

void markAsSent(const QuoteKey& key, db::Recordset& quote, db::Recordset& notes, const Transition& sent)
{
    if (key.isMain() && !text(quote, "KESTQRNo").isEmpty())
        applyTransition(requestAnswered, quote, notes);
    applyTransition(sent, quote, notes);
    quote.update();
    journal::passPoint([&] { notes.update(); });
}

/// Keeps what finishing the send needs if it is interrupted after the document was written.
void announceDocument(const QuoteRows& rows, const QString& name, const QString& content, const QStringList& images)
{
    journal::openNow(rows.key.number, rows.key.subquote);
    journal::keep(u"document"_s,
                  QJsonObject{{u"name"_s, name},
                              {u"hash"_s, journal::hashOf(files::fromCodePage(files::toCodePage(content)))},
                              {u"status"_s, quoteStatus(rows.notes)},
                              {u"stage"_s, text(rows.quote, "Job_stage")},
                              {u"number"_s, text(rows.quote, "KESTQuoteNo")},
                              {u"images"_s, QJsonArray::fromStringList(images)}});
}

/// Returns true if the document waits for the transport, or was sent.
bool isThere(const QString& name, const QString& hash)
{
    if (!files::isPlainName(name))
        return false;
    const QString folders[] = {gsUnsentPath, gsSentPath};
    return std::ranges::any_of(folders, [&](const QString& folder) {
        return files::exists(folder + name) && journal::hashOf(files::read(folder + name)) == hash;
    });
}

}  // namespace

double refuseSend(const QString& message)
{
    desktop::msgBox(message, desktop::Icon::Critical);
    return 0;
}

double CreateQuoteXML(db::Recordset& quote)
{
    QuoteRows rows(quote);
    const auto& [number, subquote] = rows.key;
    files::pathForWriting(gsUnsentPath, number + u'.' + subquote);  // fails before anything is changed
    QuoteBody body(rows.key, text(quote, "KESTAuthNo"));

    if (rows.model.eof() || text(rows.model, "MAKE").toUpper().contains("UNIVERSAL"_L1))
        return refuseSend(u"Please Select a Make and Model for this car"_s);
    rows.requireAll();
    const InsurerReference reference = referenceOf(rows);
    if (!rows.key.isMain() && reference.authorisedQuoteNumber.trimmed().isEmpty())
        return refuseSend(u"The main quote has no ORLA quote number yet, this additional cannot be sent."_s);

    const bool asked = isTrue(quote.value(u"ExtraInfo"_s));
    const ExtraInfoResult answer =
        asked ? frmExtraInfo::ShowForm(number, subquote) : BuildArrayFromDB(number, subquote);
    EnsureConnection();  // it may have been lost while the window was open
    if (asked && std::holds_alternative<QString>(answer))
        return refuseSend(std::get<QString>(answer));
    std::optional<ExtraValues> extra;
    if (const auto* values = std::get_if<ExtraValues>(&answer))
        extra = *values;

    const std::optional<qint64> days = repairDays(quote);
    if (days.value_or(0) < 0)
        return refuseSend(
            u"Cannot have a target completion date before the start date. Please check the quote details."_s);

    xml::Document document;
    const Branch request(document, "request", GetNamespaceURI());
    addHead(request, rows, reference, extra, days);
    const double total = body.addTo(request);
    if (total == 0)
        return refuseSend(
            u"Error: Cannot send $0 variations to ORLA. Please call your assessor to discuss the variation."_s);
    const QStringList images = addImages(request, rows);
    EnsureConnection();  // it may have been lost while a box about the pictures was open

    // write the document before the quote is locked: a full disk must not lock it
    const QString name = documentName(rows);
    const QString content = withoutRoot(request.xml());
    announceDocument(rows, name, content, images);
    files::write(files::pathForWriting(gsUnsentPath, name), content);
    journal::keep(u"written"_s, true);
    markAsSent(rows.key, rows.quote, rows.notes, quoteSent);
    desktop::msgBox(u"Quote Sent."_s, desktop::Icon::Information);
    EnsureConnection();  // it may have been lost while the box was open
    return total;
}

QStringList CreateImageXML(const QString& imagesPath, db::Recordset& quote)
{
    return writeImageDocuments(imagesPath, QuoteKey::fromRow(quote));
}

bool isDocumentAnnounced()
{
    return !journal::kept(u"document"_s).isUndefined();
}

namespace {

/// Marks the quote of an interrupted send, unless the insurer has done more since than to receive it.
void markLate(const QuoteKey& key, Quote& quote, const QJsonObject& document)
{
    const QString stage = text(quote.header(), "Job_stage");
    const QString status = quoteStatus(quote.notes());
    // a quote that is sent again after a revision was received before
    const bool isUntouched = status == document[u"status"_s].toString() &&
                             text(quote.header(), "KESTQuoteNo") == document[u"number"_s].toString();
    const bool isReceived = status == submitted && !isUntouched;
    if (!(isReceived || isUntouched) || (stage != document[u"stage"_s].toString() && stage != sentStage))
        return;
    Transition sent = quoteSent;
    if (isReceived)
        sent.notes[0] = {};
    markAsSent(key, quote.header(), quote.notes(), sent);
}

}  // namespace

std::optional<QStringList> finishSend(const QuoteKey& key, bool isMarked)
{
    const QJsonObject document = journal::kept(u"document"_s).toObject();
    const bool isWritten =
        journal::kept(u"written"_s).toBool() || isThere(document[u"name"_s].toString(), document[u"hash"_s].toString());
    if (!isWritten)
        return {};
    Quote quote(key);
    if (!quote.exists())
        return {};
    if (!isMarked && !quote.notes().eof())
        markLate(key, quote, document);
    return writeImageDocuments(gsImagesPath, key);
}

}  // namespace kest

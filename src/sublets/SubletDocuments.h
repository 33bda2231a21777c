// The documents that authorise sublet work: PDF files beside the message folders, one for a line of a quote.
#pragma once

#include "base/QuoteKey.h"

#include <QList>
#include <QString>

namespace kest {

/// The folder of the documents, ending in a backslash: "PDF" in the parent of the unread folder.
QString subletFolder();

struct SubletDocument {
    QString file;         // its name in the folder: QTNNO.Subquote_Number.pdf
    QString lineNumber;   // of the quote line that it belongs to
    QString description;  // of that line
    QString vendor;       // empty where the line has none
};

/// The numbers in the file names that begin with the quote, each once, in the order of the names; empty where the
/// folder can't be read. Subquote 1 finds those of subquote 10 too: which of them it has shows in its lines.
QStringList subletDocumentNumbers(const QuoteKey& quote);

/// The documents of these numbers whose line is in the quote. What can't be read is left out.
QList<SubletDocument> subletDocuments(const QuoteKey& quote, const QStringList& numbers);

}  // namespace kest

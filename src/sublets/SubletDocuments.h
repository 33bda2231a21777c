// Finds the documents that authorise sublet work: PDF files next to the message folders, one for each quote line.
#pragma once

#include "base/QuoteKey.h"

#include <QList>
#include <QString>

namespace kest {

/// Returns the folder of the documents, which ends in a backslash: "PDF" in the parent of the unread folder.
QString subletFolder();

/// A document and the quote line that it belongs to.
struct SubletDocument {
    QString file;         // its name in the folder: QTNNO.Subquote_Number.pdf
    QString lineNumber;   // of the quote line
    QString description;  // of the quote line
    QString vendor;       // empty if the line has none
};

/// Returns the numbers in the file names that begin with the quote, each once, in the order of the names. Returns none
/// if the folder can't be read. For subquote 1, also returns those of subquote 10; subletDocuments() drops them.
QStringList subletDocumentNumbers(const QuoteKey& quote);

/// Returns the documents with these numbers whose line is in the quote. Leaves out lines that can't be read.
QList<SubletDocument> subletDocuments(const QuoteKey& quote, const QStringList& numbers);

}  // namespace kest

// Writes the PDF documents that authorise sublets.
#pragma once

#include <QByteArray>
#include <QStringList>

namespace kest::app {

/// Returns a PDF file with these lines on one page. The same lines always give the same bytes.
QByteArray authorityDocument(const QStringList& lines);

}  // namespace kest::app

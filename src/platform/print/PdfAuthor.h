// Names the author of a PDF file.
#pragma once

#include <QByteArray>
#include <QString>

namespace kest::report {

/// Returns a PDF file of QPdfWriter with its author, which QPdfWriter can't set. Adds the author as an update at the
/// end of the file, so that no other byte changes. Returns the file as it is if the author is empty.
QByteArray withAuthor(const QByteArray& pdf, const QString& author);

}  // namespace kest::report

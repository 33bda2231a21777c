// The reports that a test's desktop has shown, and the shop's templates for them.
#pragma once

#include "support/Shop.h"

#include <QJsonObject>

namespace kest::test {

class Previews : public Shop {
protected:
    Previews();

    /// Puts a template under the report's name.
    static void putTemplate(const char* name, const QByteArray& content);
    /// The windows shown since the last call.
    QList<QJsonObject> windows();
    /// Their names and report numbers, joined by blanks.
    std::string shownReports();
    /// Of a table of the record: one row's cells in these fields, one that was never set as "-".
    static std::string cells(const QJsonObject& window, int row, const Text& fields);

private:
    qsizetype seen = 0;
};

/// The text of a PDF file as a reader sees it, pages divided by form feeds.
QString pdfText(const QString& file);

}  // namespace kest::test

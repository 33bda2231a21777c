#include "sublets/SubletDocuments.h"

#include "base/SharedVariables.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "quotedata/Quote.h"

#include <QRegularExpression>

using namespace Qt::StringLiterals;

namespace kest {

QString subletFolder()
{
    static const QRegularExpression lastName(u"[^\\\\/]*[\\\\/]*$"_s);
    return QString(gsUnreadPath).remove(lastName) + u"PDF\\"_s;
}

QStringList subletDocumentNumbers(const QuoteKey& quote)
{
    const QString start = quote.number + u'.' + quote.subquote;
    QStringList files;
    attempt([&] { files = files::list(subletFolder()); });

    QStringList numbers;
    for (const QString& file : files) {
        if (!file.startsWith(start, Qt::CaseInsensitive))
            continue;
        const QString number = file.section(u'_', 1).section(u'.', 0, 0);
        if (numberIn(number).value_or(0) > 0 && !numbers.contains(number))
            numbers.append(number);
    }
    return numbers;
}

QList<SubletDocument> subletDocuments(const QuoteKey& quote, const QStringList& numbers)
{
    db::Recordset lines;
    db::Recordset vendors(gConn);
    attempt([&] { lines = Quote::openLines(quote); });
    attempt([&] { vendors.open(u"SELECT VENDOR_ID, NAME FROM VENDOR"_s); });

    QList<SubletDocument> documents;
    for (const QString& number : numbers) {
        attempt([&] {
            lines.setFilter(sql("Seq_no = '{}'", number));
            if (lines.eof())
                return;
            const QString file = quote.filePrefix() + number + u".pdf"_s;
            documents.append({file, number, lines.text(u"script"_s), {}});
            const QVariant vendor = lines.value(u"VENDOR"_s);
            if (vendor.isNull() || toDouble(vendor) <= 0)
                return;
            vendors.setFilter(sql("VENDOR_ID = '{}'", vendor));
            if (!vendors.eof())
                documents.last().vendor = vendors.text(u"NAME"_s);
        });
    }
    return documents;
}

}  // namespace kest

#include "platform/print/PdfAuthor.h"

#include "platform/RuntimeError.h"

#include <QRegularExpression>
#include <QStringEncoder>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

/// Returns what the group of the pattern finds last in the file: an update counts more than what is before it.
QByteArray lastFound(const QByteArray& pdf, const QString& pattern)
{
    const QRegularExpression expression(pattern, QRegularExpression::DotMatchesEverythingOption);
    QByteArray found;
    for (auto matches = expression.globalMatch(QString::fromLatin1(pdf)); matches.hasNext();)
        found = matches.next().captured(1).toLatin1();
    if (found.isEmpty())
        throw RuntimeError(FileInputOutput, u"The PDF file has no place for its author."_s);
    return found;
}

/// Returns a text string of PDF: UTF-16 in hexadecimal digits, after a byte order mark.
QByteArray pdfText(const QString& text)
{
    QStringEncoder encoder(QStringConverter::Utf16BE, QStringConverter::Flag::WriteBom);
    return '<' + QByteArray(encoder(text)).toHex() + '>';
}

}  // namespace

QByteArray withAuthor(const QByteArray& pdf, const QString& author)
{
    if (author.isEmpty())
        return pdf;
    const QByteArray end = pdf.last(qMin<qsizetype>(pdf.size(), 4096));  // the trailer is there
    const QByteArray info = lastFound(end, u"/Info (\\d+) 0 R"_s);
    const QByteArray root = lastFound(end, u"/Root (\\d+ 0 R)"_s);
    const QByteArray size = lastFound(end, u"/Size (\\d+)"_s);
    const QByteArray table = lastFound(end, u"startxref\\s+(\\d+)"_s);
    const QByteArray fields = lastFound(pdf, u"\\n%1 0 obj\\s*<<(.*?)>>\\s*endobj"_s.arg(QLatin1StringView(info)));

    QByteArray update = pdf.endsWith('\n') ? pdf : pdf + '\n';
    const QByteArray place = QByteArray::number(update.size()).rightJustified(10, '0');
    update += info + " 0 obj\n<<" + fields + "/Author " + pdfText(author) + "\n>>\nendobj\n";
    const QByteArray start = QByteArray::number(update.size());
    update += "xref\n" + info + " 1\n" + place + " 00000 n \ntrailer\n<<\n/Size " + size + "\n/Info " + info +
              " 0 R\n/Root " + root + "\n/Prev " + table + "\n>>\nstartxref\n" + start + "\n%%EOF\n";
    return update;
}

}  // namespace kest::report

#include "loopback/AuthorityDocument.h"

#include "platform/files/CodePage.h"
#include "platform/files/files.h"

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QByteArray pageText(const QStringList& lines)
{
    QByteArray text = "BT /F1 14 Tf 60 770 Td 20 TL\n";
    for (const QString& line : lines) {
        QByteArray bytes = files::toCodePage(line);
        bytes.replace('\\', "\\\\").replace('(', "\\(").replace(')', "\\)");
        text += '(' + bytes + ") Tj T*\n";
    }
    return text + "ET\n";
}

}  // namespace

QByteArray authorityDocument(const QStringList& lines)
{
    const QByteArray text = pageText(lines);
    const QByteArray objects[] = {
        "<< /Type /Catalog /Pages 2 0 R >>", "<< /Type /Pages /Kids [3 0 R] /Count 1 >>",
        ("<< /Type /Page /Parent 2 0 R /MediaBox [0 0 595 842] "
         "/Resources << /Font << /F1 5 0 R >> >> /Contents 4 0 R >>"),
        "<< /Length " + QByteArray::number(text.size()) + " >>\nstream\n" + text + "endstream",
        "<< /Type /Font /Subtype /Type1 /BaseFont /Helvetica /Encoding /WinAnsiEncoding >>"};

    QByteArray pdf = "%PDF-1.4\n";
    QByteArray places;
    int number = 0;
    for (const QByteArray& object : objects) {
        places += QByteArray::number(pdf.size()).rightJustified(10, '0') + " 00000 n \n";
        pdf += QByteArray::number(++number) + " 0 obj\n" + object + "\nendobj\n";
    }
    const QByteArray count = QByteArray::number(number + 1);
    return pdf + "xref\n0 " + count + "\n0000000000 65535 f \n" + places + "trailer\n<< /Size " + count +
           " /Root 1 0 R >>\nstartxref\n" + QByteArray::number(pdf.size()) + "\n%%EOF\n";
}

}  // namespace kest::app

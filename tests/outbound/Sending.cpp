#include "Sending.h"

#include "outbound/SendQuote.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"
#include "shell/SharedVariables.h"

#include <QXmlStreamReader>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {
const QString quoteNamespace = u"http://quote3.webservice.orla.example"_s;
}

double Sending::send(const Text& number, int subquote)
{
    db::Recordset panel(gConn);
    panel.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}'", QString(number), subquote));
    return SendQuote(panel);
}

QString Sending::outgoing(const QString& file)
{
    return files::exists(gsUnsentPath + file) ? files::read(gsUnsentPath + file) : QString();
}

std::string Sending::sent(const QString& path, const QString& file)
{
    xml::Document document;
    document.loadXML(u"<request>"_s + outgoing(file) + u"</request>"_s);
    const xml::Node node = document.selectSingleNode(u"/request/"_s + path);
    return node ? node.text().toStdString() : "(none)";
}

void Sending::addLine(QuoteRow quote, const Text& category, const Text& script, Fields fields)
{
    db::Recordset lines(gConn);
    lines.open(u"SELECT * FROM QUOTE2 WHERE 1=0"_s);
    lines.addNew();
    lines.set(u"QTNNO"_s, quote.value("QTNNO"));
    lines.set(u"Subquote"_s, quote.value("Subquote"));
    lines.set(u"category"_s, QString(category));
    lines.set(u"script"_s, QString(script));
    lines.set(u"PartNo"_s, u""_s);
    for (const auto& [column, value] : fields)
        lines.set(column, value);
    lines.update();
}

QuoteRow Sending::sendable(const Text& number, int subquote)
{
    QuoteRow row = quote(number, subquote);
    row.line(1).set("rr_rate2", 50).set("rrhour", 2);
    return row;
}

QString withRoot(const QString& document)
{
    return u"<request xmlns=\""_s + quoteNamespace + u"\">"_s + document + u"</request>"_s;
}

QStringList readAsXml(const QString& document)
{
    QXmlStreamReader reader(document);
    QStringList lines;
    qsizetype depth = 0;
    while (!reader.atEnd()) {
        reader.readNext();
        if (reader.isStartElement()) {
            lines.append(QString(2 * depth++, u' ') + reader.name().toString() + u": "_s);
            if (reader.namespaceUri() != quoteNamespace || !reader.attributes().isEmpty())
                lines.last() +=
                    u"(namespace \"%1\", %2 attributes) "_s.arg(reader.namespaceUri()).arg(reader.attributes().size());
        } else if (reader.isEndElement()) {
            --depth;
        } else if (reader.isCharacters() && !reader.isWhitespace() && !lines.last().contains("SoftwareVersion"_L1)) {
            lines.last() += reader.text().toString();
        }
    }
    if (reader.hasError())
        lines.append(reader.errorString());
    return lines;
}

}  // namespace kest::test

#include "Sending.h"

#include "outbound/SendQuote.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"
#include "shell/SharedVariables.h"

namespace kest::test {

using namespace Qt::StringLiterals;

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

QuoteRow Sending::sendable(const Text& number, int subquote)
{
    QuoteRow row = quote(number, subquote);
    row.line(1).set("rr_rate2", 50).set("rrhour", 2);
    return row;
}

}  // namespace kest::test

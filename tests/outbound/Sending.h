// A shop that sends quotes, with functions that read its outgoing folder.
#pragma once

#include "outbound/SendQuote.h"
#include "platform/xml/xml.h"
#include "support/Shop.h"

namespace kest::test {

class Sending : public Shop {
protected:
    /// Sends the quote as "Send Quote" on the panel does. Returns the total that was sent.
    static double send(const Text& number, int subquote = 0)
    {
        db::Recordset panel =
            opened(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}'", QString(number), subquote));
        return SendQuote(panel);
    }
    /// Returns a file of the outgoing folder, or "" if it is missing.
    static QString outgoing(const QString& file)
    {
        return files::exists(gsUnsentPath + file) ? files::read(gsUnsentPath + file) : QString();
    }
    /// Returns the text of an element of an outgoing document by its path below the root, or "(none)" if it is missing.
    static std::string sent(const QString& path, const QString& file = u"500.0_1.xml"_s)
    {
        xml::Document document;
        document.loadXML(u"<request>"_s + outgoing(file) + u"</request>"_s);
        const xml::Node node = document.selectSingleNode(u"/request/"_s + path);
        return node ? node.text().toStdString() : "(none)";
    }
    /// Returns a quote with one labour line of 100, which passes all checks.
    static QuoteRow sendable(const Text& number = "500", int subquote = 0)
    {
        QuoteRow row = quote(number, subquote);
        row.line(1).set("rr_rate2", 50).set("rrhour", 2);
        return row;
    }
};

}  // namespace kest::test

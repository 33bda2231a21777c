// A shop that sends quotes, and what then lies in its outgoing folder.
#pragma once

#include "support/Shop.h"

namespace kest::test {

class Sending : public Shop {
protected:
    /// The panel is open on the quote and "Send Quote" is chosen; the total that was sent.
    static double send(const Text& number, int subquote = 0);
    /// A file of the outgoing folder, "" where it is missing.
    static QString outgoing(const QString& file);
    /// The text of an element of an outgoing document by its path below the root, "(none)" where it is missing.
    static std::string sent(const QString& path, const QString& file = QStringLiteral("500.0_1.xml"));

    using Fields = std::initializer_list<std::pair<Text, Value>>;
    /// Adds a line behind those that the quote has, without a line number where the fields give none.
    static void addLine(QuoteRow quote, const Text& category, const Text& script, Fields fields = {});
    /// A main quote with one labour line of 100, which passes all checks.
    static QuoteRow sendable(const Text& number = "500", int subquote = 0);
};

/// A quote document as another party's parser sees it: one line for each element, its depth, name and text. The
/// software's version is left out, since it changes with each release.
QStringList readAsXml(const QString& document);
/// The document within a root in the network's namespace, as the transport sends it.
QString withRoot(const QString& document);

}  // namespace kest::test

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

    /// A main quote with one labour line of 100, which passes all checks.
    static QuoteRow sendable(const Text& number = "500", int subquote = 0);
};

}  // namespace kest::test

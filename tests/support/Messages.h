// Builders for messages of every type, complete and loadable, so that a test states only what matters to it.
#pragma once

#include "support/Text.h"

#include <QString>

#include <initializer_list>
#include <utility>
#include <vector>

namespace kest::test {

using Fields = std::vector<std::pair<Text, Text>>;

class Message {
public:
    /// A network message of that type code; an empty code leaves `messageType` out.
    Message(const Text& code, const Text& root, Fields fields = {});

    /// An element by its path below the root, such as "claimCustomer/surname"; made where it is missing.
    Message& set(const Text& path, const Text& text);
    Message& without(const Text& path);

    // the element that carries this value in the message's own type
    Message& request(const Text& number) { return setFirst({"quoteRequestNumber", "kestQuoteRequestNumber"}, number); }
    Message& version(const Text& number) { return set("quoteRequestVersionNumber", number); }
    Message& quoteNumber(const Text& number)
    {
        return setFirst({"kestOriginalQuoteNumber", "kestQuoteNumber"}, number);
    }
    Message& claim(const Text& number) { return set("claimNumber", number); }
    Message& rego(const Text& rego) { return set("vehicleRegistration", rego); }
    Message& reason(const Text& text)
    {
        return setFirst({"qrCancellationReason", "reason", "reasonCode", "comments"}, text);
    }
    Message& images(std::initializer_list<Text> ids);

    // A line of the quote body; an empty indicator leaves the element out, and "D" carries the number alone.
    Message& labour(int number, const Text& indicator, Fields fields = {});
    Message& part(int number, const Text& indicator, Fields fields = {});
    Message& paint(int number, const Text& indicator, Fields fields = {});
    Message& sublet(int number, const Text& indicator, Fields fields = {});

    QString text() const;
    operator Text() const { return text(); }

private:
    struct Element {
        QString name;
        QString text;
        std::vector<Element> children;
    };

    static Element* childOf(Element& parent, const QString& name);
    Element& at(const QString& path);
    bool has(const QString& path);
    Message& setFirst(std::initializer_list<Text> paths, const Text& text);
    Message& line(const Text& section, const Text& element, int number, const Text& indicator, Fields defaults,
                  Fields fields);
    static void write(const Element& element, const QString& prefix, QString& out);

    QString code;
    Element root;
};

Message quoteRequest(const Text& request);          // QREQ
Message quoteMatch(const Text& reference);          // QMQR
Message manualQuote(const Text& reference);         // MANQ
Message quoteDeletion(const Text& quoteNumber);     // QTDL
Message revisionRequest(const Text& request);       // RRQT
Message cancellation(const Text& request);          // QRCN
Message cancellationBackout(const Text& request);   // BCQR
Message adjustedQuote(const Text& reference);       // ADQT
Message authorisedQuote(const Text& reference);     // AUQT
Message assessmentResult(const Text& quoteNumber);  // ARES
Message assessmentBackout(const Text& request);     // BACA
Message excessWaiver(const Text& reference);        // EWAP
Message submissionResponse(const Text& quoteNumber, const Text& status = "Submitted");

/// A marker message, such as the one for a quote that was sent twice.
QString marker(const Text& quoteNumber, const Text& subquote = "0", const Text& action = "DELDUPE");
/// A quote document as it lies in the sent folder: several top-level elements.
QString sentDocument(const Text& reference);

}  // namespace kest::test

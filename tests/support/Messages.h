// Builders for messages of every type, complete and loadable, so that a test states only what matters to it.
#pragma once

#include "platform/xml/xml.h"
#include "support/Text.h"

#include <QString>

#include <initializer_list>
#include <utility>
#include <vector>

namespace kest::test {

using Fields = std::vector<std::pair<Text, Text>>;

/// The elements of a line as `pairsIn` reads them.
Fields fieldsIn(const QString& cell);

class Message {
public:
    /// The message in the file of that name in tests/data/messages.
    static Message sample(const Text& name);
    /// A sample and what is otherwise in it: "AUQT excess=400 quoteBody/quoteReference=500/2".
    static Message told(const Text& text);
    /// One with these elements alone; an empty code leaves `messageType` out.
    Message(const Text& code, const Text& root);
    Message(const Message& other) : Message(other.text()) {}
    Message(Message&&) = default;

    /// An element by its path below the root, such as "claimCustomer/surname"; made where it is missing.
    Message& set(const Text& path, const Text& text);
    Message& without(const Text& path);
    /// Sets elements as "claimCustomer/surname=Tarrant excess=-"; "-" leaves one out.
    Message& with(const Text& elements);

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
    Message& labour(int number, const Text& change, Fields set = {}) { return line("labour", number, change, set); }
    Message& part(int number, const Text& change, Fields set = {}) { return line("part", number, change, set); }
    Message& paint(int number, const Text& change, Fields set = {}) { return line("paint", number, change, set); }
    Message& sublet(int number, const Text& change, Fields set = {}) { return line("sublet", number, change, set); }

    Message& line(const Text& kind, int number, const Text& change, const Fields& fields);

    QString text() const { return document.xml(); }
    operator Text() const { return text(); }

private:
    explicit Message(const QString& text);
    xml::Node at(const QString& path);
    xml::Node add(xml::Node parent, const QString& name);
    Message& setFirst(std::initializer_list<Text> paths, const Text& text);

    xml::Document document;
};

/// A complete message of a type, which a test calls with the value of the element that says what it is about.
struct Sample {
    const char* name;
    const char* path;
    Message operator()(const Text& value) const { return Message::sample(name).set(path, value); }
};

inline constexpr Sample quoteRequest{"QREQ", "quoteRequestNumber"};
inline constexpr Sample quoteMatch{"QMQR", "quoteBody/quoteReference"};
inline constexpr Sample manualQuote{"MANQ", "quoteBody/quoteReference"};
inline constexpr Sample quoteDeletion{"QTDL", "kestQuoteNumber"};
inline constexpr Sample revisionRequest{"RRQT", "quoteRequestNumber"};
inline constexpr Sample cancellation{"QRCN", "quoteRequestNumber"};
inline constexpr Sample cancellationBackout{"BCQR", "kestQuoteRequestNumber"};
inline constexpr Sample adjustedQuote{"ADQT", "quoteBody/quoteReference"};
inline constexpr Sample authorisedQuote{"AUQT", "quoteBody/quoteReference"};
inline constexpr Sample assessmentResult{"ARES", "kestOriginalQuoteNumber"};
inline constexpr Sample assessmentBackout{"BACA", "kestQuoteRequestNumber"};
inline constexpr Sample excessWaiver{"EWAP", "quoteBody/quoteReference"};
inline constexpr Sample submissionResponse{"response", "kestQuoteNumber"};

/// A marker message, such as the one for a quote that was sent twice.
QString marker(const Text& quoteNumber, const Text& subquote = "0", const Text& action = "DELDUPE");
/// A quote document as it lies in the sent folder: several top-level elements.
QString sentDocument(const Text& reference);

}  // namespace kest::test

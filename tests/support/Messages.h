// Builds complete, loadable messages of all types, so that a test sets only what matters to it.
#pragma once

#include "platform/xml/xml.h"
#include "support/Text.h"

#include <QString>

#include <initializer_list>
#include <utility>
#include <vector>

namespace kest::test {

using Fields = std::vector<std::pair<Text, Text>>;

/// Returns the elements of a line from a cell, as pairsIn() reads it.
Fields fieldsIn(const QString& cell);

/// A message of the insurer, which a test changes and then loads.
class Message {
public:
    /// Reads the message from the file of that name in tests/data/messages.
    static Message sample(const Text& name);
    /// Returns a sample with changed elements, such as "AUQT excess=400 quoteBody/quoteReference=500/2". Each further
    /// line of the text adds one to the quote body.
    static Message told(const Text& text);
    /// Creates a message without other elements. An empty code leaves `messageType` out.
    Message(const Text& code, const Text& root);
    Message(const Message& other) : Message(other.text()) {}
    Message(Message&&) = default;

    /// Sets an element by its path below the root, such as "claimCustomer/surname". Adds it if it is missing.
    Message& set(const Text& path, const Text& text);
    Message& without(const Text& path);
    /// Sets elements such as "claimCustomer/surname=Tarrant excess=-". "-" removes the element.
    Message& with(const Text& elements);

    // the element for this value in a message of this type
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

    // Adds a line to the quote body. An empty indicator leaves the element out. A line with "D" has only its number.
    Message& labour(int number, const Text& change, Fields set = {}) { return line("labour", number, change, set); }
    Message& part(int number, const Text& change, Fields set = {}) { return line("part", number, change, set); }
    Message& paint(int number, const Text& change, Fields set = {}) { return line("paint", number, change, set); }
    Message& sublet(int number, const Text& change, Fields set = {}) { return line("sublet", number, change, set); }

    Message& line(const Text& kind, int number, const Text& change, const Fields& fields);
    /// Adds a line such as "labour 1 C labourDescription=Front door". The indicator "-" leaves the element out.
    Message& line(const QString& told);

    QString text() const { return document.xml(); }
    operator Text() const { return text(); }

private:
    explicit Message(const QString& text);
    xml::Node at(const QString& path);
    xml::Node add(xml::Node parent, const QString& name);
    Message& setFirst(std::initializer_list<Text> paths, const Text& text);

    xml::Document document;
};

/// Returns complete messages of a type. The argument is the value of the element that identifies the quote or request.
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

/// Returns a marker message, such as that for a quote that was sent twice.
QString marker(const Text& quoteNumber, const Text& subquote = "0", const Text& action = "DELDUPE");
/// Returns a quote document as in the sent folder, with several top-level elements.
QString sentDocument(const Text& reference);

}  // namespace kest::test

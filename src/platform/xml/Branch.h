// Builds the element tree of an outgoing document: an element list is a list of elements.
#pragma once

#include "platform/xml/xml.h"

#include <QString>

#include <vector>

namespace kest {

/// One row of an element list: an element, whether it is there, and its text.
struct Leaf {
    const char* name;
    bool present;
    QString text;
};
using Leaves = std::vector<Leaf>;

/// Marks the elements that every document carries, with a text or without.
constexpr bool always = true;

/// An element that is there only when its text is not empty.
inline Leaf filled(const char* name, const QString& text)
{
    return {name, !text.isEmpty(), text};
}

/// An element of a document that is being built. It stands in the tree as soon as it is made.
class Branch {
public:
    /// The root of an empty document; everything below it lies in the same namespace, none for an empty one.
    Branch(xml::Document& document, const char* rootName, const QString& namespaceURI = {});

    Branch add(const char* name) const;
    void add(const char* name, const QString& text) const;
    /// Those of the list that are present, in its order.
    void add(const Leaves& leaves) const;
    /// An element that lies in no namespace.
    void addOutside(const char* name, const QString& text) const;

    /// The serialised text of the element.
    QString xml() const { return node.xml(); }

private:
    Branch(const Branch& parent, xml::Node child) : document(parent.document), uri(parent.uri), node(child) {}

    xml::Document* document;
    QString uri;
    xml::Node node;
};

}  // namespace kest

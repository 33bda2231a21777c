// Builds the elements of outgoing documents from lists.
#pragma once

#include "platform/xml/xml.h"

#include <QString>

#include <vector>

namespace kest {

/// An element of a list: its name, whether it is present, and its text.
struct Leaf {
    const char* name;
    bool present;
    QString text;
};
using Leaves = std::vector<Leaf>;

/// Marks elements that are present in every document, even without a text.
constexpr bool always = true;

/// Returns an element that is present only if its text is not empty.
inline Leaf filled(const char* name, const QString& text)
{
    return {name, !text.isEmpty(), text};
}

/// An element of a document under construction. It is part of the tree from the beginning.
class Branch {
public:
    /// Creates the root of an empty document. All elements below it have the same namespace, or none if `namespaceURI`
    /// is empty.
    Branch(xml::Document& document, const char* rootName, const QString& namespaceURI = {});

    /// Adds an element for other elements.
    Branch add(const char* name) const;
    /// Adds an element with a text.
    void add(const char* name, const QString& text) const;
    /// Adds those elements of the list that are present, in order.
    void add(const Leaves& leaves) const;
    /// Adds an element without a namespace.
    void addOutside(const char* name, const QString& text) const;

    /// Returns the element as XML text.
    QString xml() const { return node.xml(); }

private:
    Branch(const Branch& parent, xml::Node child) : document(parent.document), uri(parent.uri), node(child) {}

    xml::Document* document;
    QString uri;
    xml::Node node;
};

}  // namespace kest

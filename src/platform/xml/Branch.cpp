#include "platform/xml/Branch.h"

namespace kest {

Branch::Branch(xml::Document& tree, const char* rootName, const QString& namespaceURI)
    : document(&tree),
      uri(namespaceURI),
      node(tree.appendChild(tree.createNode(xml::NodeType::Element, QString::fromLatin1(rootName), namespaceURI)))
{
}

Branch Branch::add(const char* name) const
{
    return {*this, node.appendChild(document->createNode(xml::NodeType::Element, QString::fromLatin1(name), uri))};
}

void Branch::add(const char* name, const QString& text) const
{
    add(name).node.setText(text);
}

void Branch::addOutside(const char* name, const QString& text) const
{
    node.appendChild(document->createNode(xml::NodeType::Element, QString::fromLatin1(name))).setText(text);
}

void Branch::add(const Leaves& leaves) const
{
    for (const Leaf& leaf : leaves)
        if (leaf.present)
            add(leaf.name, leaf.text);
}

}  // namespace kest

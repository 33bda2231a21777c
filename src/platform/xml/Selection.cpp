#include "platform/RuntimeError.h"
#include "platform/xml/DocumentData.h"

#include <libxml/xpathInternals.h>

#include <memory>
#include <unordered_map>

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

using Expression = std::unique_ptr<xmlXPathCompExpr, decltype(&xmlXPathFreeCompExpr)>;
using Context = std::unique_ptr<xmlXPathContext, decltype(&xmlXPathFreeContext)>;
using Result = std::unique_ptr<xmlXPathObject, decltype(&xmlXPathFreeObject)>;

/// Prevents libxml2 from printing to standard error.
void passOver(void*, xmlErrorPtr) {}

[[noreturn]] void failAsExpression(const QString& path)
{
    throw RuntimeError(TypeMismatch, u"The path can't be evaluated: "_s + path);
}

/// Returns a compiled path. Each thread keeps its compiled paths, but not without limit, because paths can contain
/// values.
xmlXPathCompExprPtr compiled(const QString& path)
{
    constexpr size_t mostKept = 2000;
    thread_local std::unordered_map<QString, Expression> kept;
    const auto known = kept.find(path);
    if (known != kept.end())
        return known->second.get();

    const Context context(xmlXPathNewContext(nullptr), &xmlXPathFreeContext);
    context->error = passOver;
    Expression made(xmlXPathCtxtCompile(context.get(), toXml(path.toUtf8())), &xmlXPathFreeCompExpr);
    if (!made)
        failAsExpression(path);
    if (kept.size() >= mostKept)
        kept.clear();
    return kept.emplace(path, std::move(made)).first->second.get();
}

}  // namespace

void DocumentData::dropSelectionContext()
{
    xmlXPathFreeContext(context);
    context = nullptr;
    ordered = false;
}

xmlXPathContextPtr DocumentData::selectionContext()
{
    if (context && contextPrefixes != prefixes)
        dropSelectionContext();
    if (!context) {
        context = xmlXPathNewContext(document);
        Q_CHECK_PTR(context);
        context->error = passOver;
        for (auto prefix = prefixes.cbegin(); prefix != prefixes.cend(); ++prefix)
            xmlXPathRegisterNs(context, toXml(prefix.key().toUtf8()), toXml(prefix.value().toUtf8()));
        contextPrefixes = prefixes;
    }
    if (!ordered) {
        xmlXPathOrderDocElems(document);
        ordered = true;
    }
    return context;
}

QList<Node> DocumentData::select(xmlNodePtr from, const QString& path, bool firstOnly)
{
    const xmlXPathCompExprPtr expression = compiled(path);
    const xmlXPathContextPtr here = selectionContext();
    here->node = from;
    const Result result(xmlXPathCompiledEval(expression, here), &xmlXPathFreeObject);
    if (!result || result->type != XPATH_NODESET)
        failAsExpression(path);
    QList<Node> nodes;
    const xmlNodeSetPtr found = result->nodesetval;
    for (int i = 0; found && i < found->nodeNr; ++i) {
        const xmlNodePtr node = found->nodeTab[i];
        if (node->type == XML_NAMESPACE_DECL || node->type == XML_DOCUMENT_NODE)
            continue;  // this layer has no such nodes
        nodes.append(wrap(node));
        if (firstOnly)
            break;
    }
    return nodes;
}

}  // namespace kest::xml

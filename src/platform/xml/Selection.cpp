// Selects nodes by XPath expressions, each of which is compiled once.
#include "platform/RuntimeError.h"
#include "platform/xml/DocumentData.h"

#include <QRegularExpression>
#include <QVarLengthArray>

#include <libxml/xpathInternals.h>

#include <cstdint>
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

struct Step {
    QString prefix;
    QByteArray name;  // empty for "*", any element
};

/// The steps of a path that consists of names only, such as "//p:a/p:b" or "a", or of names and a "*" at the end. A
/// walk finds its nodes faster than libxml2, which numbers the whole document first, and looks at all of it for "//".
struct PlainPath {
    explicit PlainPath(const QString& path)
    {
        static const QRegularExpression form(u"^(//)?(?:\\w+:)?[A-Za-z]\\w*(?:/(?:\\w+:)?[A-Za-z]\\w*)*(?:/\\*)?$"_s);
        const auto match = form.match(path);
        anywhere = !match.capturedView(1).isEmpty();
        for (const QString& step : match.captured().sliced(anywhere ? 2 : 0).split(u'/', Qt::SkipEmptyParts)) {
            const qsizetype colon = step.indexOf(u':');
            steps.push_back({step.left(qMax(colon, 0)), step == u'*' ? QByteArray() : step.sliced(colon + 1).toUtf8()});
        }
    }

    bool anywhere = false;    // the first step may be at any depth
    std::vector<Step> steps;  // none if there is something else in the path
};

/// Finds the nodes of a plain path.
class Walk {
public:
    Walk(const PlainPath& path, const QMap<QString, QByteArray>& urisOfPrefixes) : steps(path.steps)
    {
        for (const Step& step : steps) {
            const auto uri = urisOfPrefixes.constFind(step.prefix);
            isPossible = isPossible && (step.prefix.isEmpty() || uri != urisOfPrefixes.cend());
            uris.append(step.prefix.isEmpty() || !isPossible ? QByteArray() : *uri);
        }
    }

    /// Returns true if the path is plain and all its prefixes are known.
    bool canBeWalked() const { return !steps.empty() && isPossible; }

    xmlNodePtr firstIn(const xmlDoc* document) const
    {
        xmlNodePtr at = document->children;
        while (at && !endsAt(at)) {
            xmlNodePtr next = at->type == XML_ELEMENT_NODE ? at->children : nullptr;
            for (xmlNodePtr from = at; !next && from; from = from->parent)
                next = from->next;
            at = next;
        }
        return at;
    }

    xmlNodePtr firstBelow(const xmlNode* parent) const
    {
        std::vector<xmlNodePtr> found;
        findBelow(parent, found, 1);
        return found.empty() ? nullptr : found.front();
    }

    /// Adds the nodes of a path without "//" to `found`, in the order of the document, until there are `most`.
    void findBelow(const xmlNode* parent, std::vector<xmlNodePtr>& found, size_t most = SIZE_MAX, size_t step = 0) const
    {
        for (xmlNodePtr child = parent->children; child && found.size() < most; child = child->next) {
            if (!fits(child, step))
                continue;
            if (step + 1 == steps.size())
                found.push_back(child);
            else
                findBelow(child, found, most, step + 1);
        }
    }

private:
    bool fits(const xmlNode* node, size_t step) const
    {
        if (node->type != XML_ELEMENT_NODE)
            return false;
        if (steps[step].name.isEmpty())
            return true;
        if (!xmlStrEqual(node->name, toXml(steps[step].name)))
            return false;
        const bool named = !steps[step].prefix.isEmpty();
        return node->ns ? named && xmlStrEqual(node->ns->href, toXml(uris[qsizetype(step)])) : !named;
    }

    /// Returns true if the last step is at this node, and those before it are at its parents.
    bool endsAt(const xmlNode* node) const
    {
        for (size_t step = steps.size(); step-- > 0; node = node->parent) {
            if (!fits(node, step))
                return false;
        }
        return true;
    }

    const std::vector<Step>& steps;
    QVarLengthArray<QByteArray, 4> uris;
    bool isPossible = true;
};

struct KnownPath {
    PlainPath plain;
    Expression compiled;
};

/// Returns what there is to know of a path. Each thread keeps its paths, but not without limit, because paths can
/// contain values.
const KnownPath& knownPath(const QString& path)
{
    constexpr size_t mostKept = 2000;
    thread_local std::unordered_map<QString, KnownPath> kept;
    const auto known = kept.find(path);
    if (known != kept.end())
        return known->second;

    const Context context(xmlXPathNewContext(nullptr), &xmlXPathFreeContext);
    context->error = passOver;
    Expression made(xmlXPathCtxtCompile(context.get(), toXml(path.toUtf8())), &xmlXPathFreeCompExpr);
    if (!made)
        failAsExpression(path);
    if (kept.size() >= mostKept)
        kept.clear();
    return kept.emplace(path, KnownPath{PlainPath(path), std::move(made)}).first->second;
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

Node DocumentData::selectFirst(xmlNodePtr from, const QString& path)
{
    const PlainPath& plain = knownPath(path).plain;
    if (const Walk walk(plain, uris); walk.canBeWalked())
        return wrap(plain.anywhere ? walk.firstIn(document) : walk.firstBelow(from));
    const QList<Node> found = select(from, path);
    return found.isEmpty() ? Node() : found.first();
}

QList<Node> DocumentData::select(xmlNodePtr from, const QString& path)
{
    const KnownPath& known = knownPath(path);
    QList<Node> nodes;
    if (const Walk walk(known.plain, uris); !known.plain.anywhere && walk.canBeWalked()) {
        std::vector<xmlNodePtr> walked;
        walk.findBelow(from, walked);
        for (const xmlNodePtr node : walked)
            nodes.append(wrap(node));
        return nodes;
    }
    const xmlXPathContextPtr here = selectionContext();
    here->node = from;
    const Result result(xmlXPathCompiledEval(known.compiled.get(), here), &xmlXPathFreeObject);
    if (!result || result->type != XPATH_NODESET)
        failAsExpression(path);
    const xmlNodeSetPtr found = result->nodesetval;
    for (int i = 0; found && i < found->nodeNr; ++i) {
        const xmlNodePtr node = found->nodeTab[i];
        if (node->type == XML_NAMESPACE_DECL || node->type == XML_DOCUMENT_NODE)
            continue;  // this layer has no such nodes
        nodes.append(wrap(node));
    }
    return nodes;
}

}  // namespace kest::xml

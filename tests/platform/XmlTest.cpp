// Documents: what is refused and by which code, what a node answers, how a document is written.
#include "platform/xml/xml.h"
#include "support/Failure.h"
#include "support/TestProfile.h"

#include <QElapsedTimer>
#include <QFile>
#include <QTemporaryDir>

#include <gtest/gtest.h>

using namespace Qt::StringLiterals;
using namespace kest;
using namespace kest::xml;
using test::failureOf;

namespace {

quint32 codeOf(const QString& text)
{
    Document document;
    const bool loaded = document.loadXML(text);
    EXPECT_EQ(loaded, document.parseError().errorCode == 0) << text.left(80).toStdString();
    EXPECT_EQ(document.documentElement().isNull(), document.parseError().errorCode != 0);
    return document.parseError().errorCode;
}

Document parsed(const QString& text)
{
    Document document;
    document.setSelectionNamespaces({{u"rootns"_s, u"urn:quote"_s}});
    EXPECT_TRUE(document.loadXML(text)) << document.parseError().reason.toStdString();
    return document;
}

QString names(const QList<Node>& nodes)
{
    QStringList all;
    for (const Node& node : nodes)
        all.append(node.nodeName());
    return all.join(u' ');
}

}  // namespace

TEST(XmlErrors, ANulEndsNoText)
{
    for (QString text : {u"<a>1</a>|"_s, u"<a>1</a>|<b/>"_s, u"<a>1|</a>"_s, u"|<a>&</a>"_s}) {
        const quint32 code = codeOf(text.replace(u'|', QChar(u'\0')));
        EXPECT_TRUE(code != 0 && code != BareAmpersand && code != SecondRoot) << text.toStdString();
    }
}

TEST(XmlErrors, TheBareAmpersandAndTheSecondRootHaveCodesOfTheirOwn)
{
    enum Kind : quint8 { Fine, Ampersand, Root, Other };
    const auto kindOf = [](quint32 code) {
        return code == 0 ? Fine : code == BareAmpersand ? Ampersand : code == SecondRoot ? Root : Other;
    };
    const std::pair<Kind, QList<const char*>> cases[] = {
        {Ampersand,
         {"<a>&</a>", "<a>x & y</a>", "<a>Smith &Co</a>", "<a>&&amp;</a>", "<a>&1;</a>", "<a>&;</a>", "<a b='x & y'/>",
          "<a b=\"?x=1&y=2\"/>", "<a>&amp</a>", "<a><b>&amp;</b>\n&\n</a>", "<!-- & --><a><![CDATA[&]]>&</a>",
          "<a>&</a><b/>", "<a>& "}},
        {Root,
         {"<a/><b/>", "<a>1</a>\r\n<a>2</a>", "<a/><!-- c --><?p q?>\n<b>", "<a/><?xml version='1.0'?><b/>",
          "<a/><b>&</b>", "<q:a xmlns:q='u'/><q:a/>", "<a/><![CDATA[x]]><b/>", "<a/><é/>"}},
        {Fine,
         {"<a>&amp;&lt;&#38;&#x26;</a>", "<a><![CDATA[x & y]]></a>", "<!-- & --><a/>", "<?p & ?><a/>",
          "<a/>\r\n<!-- c --><?p?>\n"}},
        {Other, {"<a>&nbsp;</a>", "<a>&#0;</a>", "<a>&#x;</a>", "<a>&#;</a>", "<a>x < y</a>", "<a/>&", "&<a/>"}},
        {Other, {"<a b='<'/>", "<a>]]></a>", "<a&b/>", "<a/>junk", "<a/></b>", "<a/><", "<a/><1/>", "<a/>& <b/>"}},
        {Other, {"<a/>x<b/>", "x<a/><b/>", "<a/><!b>", "<a/><!-- <b/>", "<a><b></a><c/>", "<a", "", " \n", "text"}},
        {Other, {"<a>", "<a></b>", "<a b='1' b='2'/>", "<!-- only -->", "<a b=1/>", "<a xmlns:x='u' xmlns:x='u'/>"}},
        {Other, {"<p:a/>", "<a p:b='1'/>", "<a:b:c xmlns:a='u'/>", "<a>\x01</a>", " <?xml version='1.0'?><a/>"}}};
    for (const auto& [kind, texts] : cases)
        for (const char* text : texts)
            EXPECT_EQ(kindOf(codeOf(QString::fromUtf8(text))), kind) << text;
}

TEST(XmlErrors, ADocumentTypeIsRefusedAndNothingIsFetched)
{
    const QTemporaryDir folder;
    QFile secret(folder.filePath(u"secret.txt"_s));
    ASSERT_TRUE(secret.open(QFile::WriteOnly));
    secret.write("secret");
    secret.close();
    QString bomb = u"<!DOCTYPE a [<!ENTITY e0 'ha'>"_s;
    for (int i = 1; i < 30; ++i)
        bomb += u"<!ENTITY e%1 '&e%2;&e%2;&e%2;&e%2;&e%2;&e%2;&e%2;&e%2;&e%2;&e%2;'>"_s.arg(i).arg(i - 1);
    QElapsedTimer time;
    time.start();
    for (const QString& text :
         {u"<!DOCTYPE a><a/>"_s, u"<!DOCTYPE a [<!ENTITY x 'y'>]><a>&x;</a>"_s, bomb + u"]><a>&e29;</a>"_s,
          u"<!DOCTYPE a SYSTEM 'file://%1'><a/>"_s.arg(secret.fileName()),
          u"<!DOCTYPE a [<!ENTITY x SYSTEM 'file://%1'>]><a>&x;</a>"_s.arg(secret.fileName()),
          u"<!DOCTYPE a [<!ENTITY % x SYSTEM 'file://%1'>%x;]><a/>"_s.arg(secret.fileName())}) {
        const quint32 code = codeOf(text);
        EXPECT_TRUE(code != 0 && code != BareAmpersand && code != SecondRoot) << std::hex << code;
    }
    EXPECT_LT(time.elapsed(), 2000);
}

TEST(XmlErrors, TheReportShowsTheLineOfTheError)
{
    Document document;
    EXPECT_FALSE(document.loadXML(u"<a>\r\n\t<b>1</b>\r\n\t<c>x & y</c>\r\n</a>"_s));
    EXPECT_EQ(document.parseError().srcText, u"\t<c>x & y</c>"_s);
    EXPECT_EQ(document.parseError().line, 3);
    EXPECT_FALSE(document.parseError().reason.isEmpty());

    EXPECT_FALSE(document.loadXML(u"<a>"_s + QString(1000000, u'x') + u"<b></c>"_s + QString(1000000, u'y')));
    EXPECT_LE(document.parseError().srcText.size(), 10000);
    EXPECT_TRUE(document.parseError().srcText.contains(u"<b></c>"_s));

    EXPECT_TRUE(document.loadXML(u"<a/>"_s));
    EXPECT_EQ(document.parseError().errorCode, 0U);
    EXPECT_FALSE(document.loadXML(u"<a>"_s));
    EXPECT_EQ(document.xml(), QString()) << "a failed parse leaves nothing of the text before";
}

TEST(XmlLimits, HostileSizesFailQuickly)
{
    QString manyAttributes = u"<a "_s;
    for (int i = 0; i < 200000; ++i)
        manyAttributes += u"a%1='' "_s.arg(i);
    QElapsedTimer time;
    time.start();
    EXPECT_NE(codeOf(u"<a>"_s.repeated(100000) + u"</a>"_s.repeated(100000)), 0U);
    EXPECT_NE(codeOf(manyAttributes + u"/>"_s), 0U);
    EXPECT_NE(codeOf(u"<a>"_s.repeated(Document::maximumDepth + 1) + u"</a>"_s.repeated(Document::maximumDepth + 1)),
              0U);
    EXPECT_LT(time.elapsed(), 10000);

    EXPECT_EQ(codeOf(u"<a>"_s.repeated(Document::maximumDepth) + u"</a>"_s.repeated(Document::maximumDepth)), 0U);
    EXPECT_EQ(codeOf(u"<a t='"_s + u"x=1 "_s.repeated(10000) + u"'><!-- <b "_s + u"= "_s.repeated(9000) + u"--></a>"_s),
              0U);

    const QString large(100 * 1024 * 1024, u'A');
    time.restart();
    const Document document = parsed(u"<a><pdf>"_s + large + u"</pdf></a>"_s);
    EXPECT_EQ(document.textOf(u"pdf"_s).size(), large.size());
    EXPECT_LT(time.elapsed(), 30000);
}

TEST(XmlNodes, BlankTextIsNoNodeAndOtherTextIsNotTrimmed)
{
    const Document document =
        parsed(u"<a>\n <b> x </b> <!-- c -->\t<c>1<d/> <e/>2</c><f>  </f><g><![CDATA[ ]]></g></a>"_s);
    EXPECT_EQ(names(document.documentElement().childNodes()), u"b #comment c f g"_s);
    EXPECT_EQ(document.documentElement().text(), u" x 12 "_s);
    EXPECT_EQ(names(document.selectSingleNode(u"c"_s).childNodes()), u"#text d e #text"_s);
    EXPECT_EQ(document.textOf(u"f"_s), QString());
    EXPECT_TRUE(document.selectSingleNode(u"f"_s).firstChild().isNull());
    EXPECT_EQ(document.xml(), u"<a><b> x </b><!-- c --><c>1<d/><e/>2</c><f/><g><![CDATA[ ]]></g></a>"_s);
}

TEST(XmlNodes, TextJoinsWhatIsShownOfAllDescendants)
{
    const Document document =
        parsed(u"<?p q?><!-- x --><a>1<b>&lt;2<![CDATA[<3>]]></b><!-- no --><?no no?>&#52;<c><d>5</d></c></a>"_s);
    EXPECT_EQ(document.firstChild().nodeName(), u"a"_s) << "the root, whatever stands before it";
    EXPECT_EQ(document.firstChild().text(), u"1<2<3>45"_s);
    EXPECT_EQ(document.selectSingleNode(u"b"_s).lastChild().nodeType(), NodeType::CDataSection);
}

TEST(XmlNodes, AttributesStandInDocumentOrder)
{
    const QString text =
        u"<q:a one = '1' xmlns:q='urn:quote'\n xmlns='d' q:two='a&amp;\"' xmlns:z=\">z'\" three=''><b x='1' y='2'/></q:a>"_s;
    const Document document = parsed(text);
    QStringList all;
    for (const Attribute& attribute : document.documentElement().attributes())
        all.append(attribute.name + u'=' + attribute.value);
    EXPECT_EQ(all.join(u' '), u"one=1 xmlns:q=urn:quote xmlns=d q:two=a&\" xmlns:z=>z' three="_s);
    const Document again = parsed(document.xml());
    EXPECT_EQ(again.xml(), document.xml());
    EXPECT_EQ(again.documentElement().attributes().size(), 6);
}

TEST(XmlNodes, SelectionsKnowThePrefixesOfTheDocument)
{
    const Document document = parsed(
        u"<x:r xmlns:x='urn:quote'><messageType>QREQ</messageType><x:l><x:n>1</x:n></x:l><x:l><x:n>2</x:n></x:l><l/></x:r>"_s);
    EXPECT_EQ(document.textOf(u"messageType"_s), u"QREQ"_s);
    EXPECT_EQ(document.textOf(u"//rootns:l/rootns:n"_s), u"1"_s);
    const QList<Node> lines = document.selectNodes(u"//rootns:l"_s);
    ASSERT_EQ(lines.size(), 2);
    EXPECT_EQ(lines[1].textOf(u"rootns:n"_s), u"2"_s);
    EXPECT_EQ(lines[1].textOf(u"//rootns:n"_s), u"1"_s) << "from the root of the document";
    EXPECT_EQ(document.selectSingleNode(u"//rootns:n[.='2']/.."_s), lines[1]);
    EXPECT_TRUE(document.selectSingleNode(u"//l/n"_s).isNull());
    EXPECT_EQ(document.textOrEmptyOf(u"nothing"_s), QString());
    EXPECT_EQ(failureOf([&] { document.textOf(u"nothing"_s); }), NoObject);
    EXPECT_EQ(failureOf([&] { document.selectNodes(u"//["_s); }), TypeMismatch);
    EXPECT_EQ(failureOf([&] { document.selectNodes(u"//unknown:x"_s); }), TypeMismatch);
    EXPECT_EQ(failureOf([&] { document.selectNodes(u"count(//l)"_s); }), TypeMismatch);
}

TEST(XmlText, EncodingsDoNotMatter)
{
    EXPECT_EQ(parsed(u"<?xml version='1.0' encoding='utf-16'?><a>\u00e9\u20ac</a>"_s).documentElement().text(),
              u"\u00e9\u20ac"_s);
    EXPECT_EQ(parsed(u"<?xml version='1.0' encoding='windows-1252'?><a>\u00e9</a>"_s).documentElement().text(),
              u"\u00e9"_s);
    EXPECT_EQ(parsed(u"<a>\U0001F697</a>"_s).xml(), u"<a>\U0001F697</a>"_s);
}

TEST(XmlBuilding, TheNamespaceIsDeclaredOnceAtTheRoot)
{
    const QString space = u"urn:quote>x"_s;
    Document document;
    const Node root = document.createNode(NodeType::Element, u"request"_s, space);
    const Node body = document.createNode(NodeType::Element, u"quoteBody"_s, space);
    Node leaf = document.createNode(NodeType::Element, u"n"_s, space);
    leaf.setText(u"1"_s);
    body.appendChild(leaf);  // the leaves first, the root last
    root.appendChild(body);
    document.appendChild(root);
    EXPECT_EQ(document.xml(), u"<request xmlns=\"urn:quote&gt;x\"><quoteBody><n>1</n></quoteBody></request>"_s);

    const Node plain = document.createNode(NodeType::Element, u"plain"_s);
    body.appendChild(plain);
    plain.appendChild(document.createNode(NodeType::Element, u"inner"_s));
    plain.appendChild(document.createNode(NodeType::Element, u"q:back"_s, space));
    EXPECT_EQ(plain.xml(), u"<plain><inner/><q:back xmlns:q=\"urn:quote&gt;x\"/></plain>"_s);
    EXPECT_TRUE(document.xml().contains(u"<plain xmlns=\"\"><inner/>"_s));
    const Document again = parsed(document.xml());
    EXPECT_EQ(again.selectSingleNode(u"//*[local-name()='back']"_s).namespaceURI(), space);
    EXPECT_EQ(again.selectSingleNode(u"//inner"_s).namespaceURI(), QString());
    EXPECT_EQ(failureOf([&] { document.createNode(NodeType::Element, u"a b"_s); }), TypeMismatch);
    EXPECT_EQ(failureOf([&] { document.appendChild(document.createNode(NodeType::Element, u"two"_s)); }), TypeMismatch);
}

TEST(XmlBuilding, TextIsWrittenAsItselfWithoutForbiddenCharacters)
{
    Document document;
    Node root = document.createNode(NodeType::Element, u"a"_s);
    document.appendChild(root);
    root.setText(u"x\u0001\u001f<&>\"'\u00e9\u20ac\t\r\n\ufffe]]>\U0001F697"_s + QChar(0xD800));
    EXPECT_EQ(root.text(), u"x<&>\"'\u00e9\u20ac\t\r\n]]>\U0001F697"_s);
    EXPECT_EQ(document.xml(), u"<a>x&lt;&amp;&gt;\"'\u00e9\u20ac\t\r\n]]&gt;\U0001F697</a>"_s);
    root.setText(u"  "_s);
    EXPECT_EQ(document.xml(), u"<a>  </a>"_s);
    root.setText(QString());
    EXPECT_EQ(document.xml(), u"<a/>"_s);

    Node cdata = document.createNode(NodeType::CDataSection, {});
    cdata.setText(u"]]>&"_s);
    root.appendChild(cdata);
    Node comment = document.createNode(NodeType::Comment, {});
    comment.setText(u"a---b-"_s);
    root.insertBefore(comment, cdata);
    root.setAttribute(u"b"_s, u"<\"\n\u0002>"_s);
    root.setAttribute(u"b"_s, u"<\"\n\u0003>'"_s);
    const Document again = parsed(document.xml());
    EXPECT_EQ(again.documentElement().text(), u"]]>&"_s);
    EXPECT_EQ(again.documentElement().attributes().first().value, u"<\"\n>'"_s);
}

TEST(XmlBuilding, NodesMoveAndOutliveTheirPlace)
{
    Document document = parsed(u"<a><b>1</b><c><d>2</d></c></a>"_s);
    const Node root = document.documentElement();
    const Node b = root.firstChild();
    const Node c = b.nextSibling();
    c.appendChild(b);
    EXPECT_EQ(document.xml(), u"<a><c><d>2</d><b>1</b></c></a>"_s);
    EXPECT_EQ(names(document.selectNodes(u"//*"_s)), u"a c d b"_s);
    root.removeChild(c);
    EXPECT_EQ(document.xml(), u"<a/>"_s);
    EXPECT_EQ(c.text(), u"21"_s) << "a node outlives its removal";
    EXPECT_EQ(failureOf([&] { b.appendChild(c); }), TypeMismatch) << "not below itself";
    EXPECT_EQ(failureOf([&] { root.removeChild(b); }), TypeMismatch);
    Document other;
    EXPECT_EQ(failureOf([&] { root.appendChild(other.createNode(NodeType::Element, u"x"_s)); }), TypeMismatch);
}

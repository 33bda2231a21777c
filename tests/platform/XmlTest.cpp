// Tests documents: which texts are refused with which code, what nodes return, and how documents are written.
#include "platform/xml/xml.h"
#include "support/Cost.h"
#include "support/Test.h"

using namespace kest::xml;

static QString outcome(const QString& text)
{
    Document document;
    const bool loaded = document.loadXML(text);
    const quint32 code = document.parseError().errorCode;
    EXPECT_EQ(loaded, code == 0) << text.left(80);
    if (loaded)
        document.documentElement().text();  // its cost counts, too
    EXPECT_EQ(document.documentElement().isNull(), code != 0) << text.left(80);
    if (code == 0)
        return u"fine"_s;
    return code == BareAmpersand ? u"bare ampersand"_s : code == SecondRoot ? u"second root"_s : u"other"_s;
}

/// Returns the nodes that a path selects, as "name=text".
static QString selected(const Document& document, const QString& path)
{
    QStringList nodes;
    for (const Node& node : document.selectNodes(path))
        nodes.append(node.nodeName() + u'=' + node.text());
    return nodes.join(u", "_s);
}

/// Writes out repetitions such as "{<b/>}*3". "#" is their number.
static QString expanded(QString text)
{
    static const QRegularExpression repetition(u"\\{([^{}]*)\\}\\*(\\d+)"_s);
    for (auto found = repetition.match(text); found.hasMatch(); found = repetition.match(text)) {
        QString all;
        for (int i = 0; i < found.captured(2).toInt(); ++i)
            all += found.captured(1).replace(u'#', QString::number(i));
        text.replace(found.capturedStart(), found.capturedLength(), all);
    }
    return text;
}

TEST(XmlErrors, WhatCanBeRepairedHasItsOwnCode)
{
    for (const QStringList& row : test::rowsIn("xml-errors.txt"))
        for (const QString& text : row.mid(1))
            EXPECT_EQ(outcome(text), row[0]) << text;
}

TEST(XmlErrors, NoTextOfAMegabyteCostsMuchTimeOrMemory)
{
    for (const auto& [expected, text] : casesIn<2>("xml-floods.txt")) {
        const QString flood = expanded(text);
        const Cost cost = costOf([&] { EXPECT_EQ(outcome(flood), expected) << text; });
        EXPECT_LT(cost.milliseconds, 200 * slowness) << text;
        EXPECT_TRUE(cost.megabytes < 100 || !memoryIsReal) << text << ": " << cost.megabytes;
    }
}

TEST(XmlErrors, ElementsHaveALimit)
{
    const QString flood = u"<a>"_s + u"<a/>"_s.repeated(3'000'000) + u"</a>"_s;
    const Cost cost = costOf([&] { EXPECT_EQ(outcome(flood), u"other"_s); });
    EXPECT_TRUE(cost.megabytes < 250 || !memoryIsReal) << cost.megabytes;
}

TEST(XmlErrors, TheReportShowsTheLineOfTheError)
{
    Document document;
    EXPECT_TRUE(document.loadXML(u"<a/>"_s));
    EXPECT_FALSE(document.loadXML(u"<a>\r\n\t<b>1</b>\r\n\t<c>x & y</c>\r\n</a>"_s));
    EXPECT_EQ(document.xml(), QString()) << "a failed parse leaves nothing of the text before";
    EXPECT_EQ(document.parseError().srcText, u"\t<c>x & y</c>"_s);
    EXPECT_EQ(document.parseError().line, 3);
    EXPECT_FALSE(document.parseError().reason.isEmpty());

    EXPECT_FALSE(document.loadXML(u"<a>"_s + QString(1000000, u'x') + u"<b></c>"_s + QString(1000000, u'y')));
    EXPECT_LE(document.parseError().srcText.size(), 10000);
    EXPECT_TRUE(document.parseError().srcText.contains(u"<b></c>"_s));
}

TEST(XmlNodes, AreSelectedAsTheTableSays)
{
    Document document;
    document.setSelectionNamespaces({{u"rootns"_s, u"urn:quote"_s}});
    for (const QStringList& row : rowsIn("xml-nodes.txt"))
        if (row.size() == 1) {
            EXPECT_TRUE(document.loadXML(row[0])) << document.parseError().reason;
            EXPECT_EQ(document.firstChild(), document.documentElement()) << "the root, whatever stands before it";
        } else {
            EXPECT_EQ(row[0] == u"text"_s ? document.xml() : outcomeOf([&] { return selected(document, row[0]); }),
                      row[1])
                << row[0];
        }
    const QList<Node> lines = document.selectNodes(u"//rootns:l"_s);
    ASSERT_EQ(lines.size(), 2);
    EXPECT_EQ(lines[1].textOf(u"rootns:n"_s), u"2"_s);
    EXPECT_EQ(lines[1].textOf(u"//rootns:n"_s), u"1"_s) << "from the root of the document";
    EXPECT_EQ(lines[1].childNodes().size(), 1);
    EXPECT_EQ(document.textOrEmptyOf(u"nothing"_s), QString());
    EXPECT_EQ(failureOf([&] { document.textOf(u"nothing"_s); }), NoObject);
}

TEST(XmlBuilding, TextIsWrittenAsItselfWithoutForbiddenCharacters)
{
    Document document;
    Node root = document.appendChild(document.createNode(NodeType::Element, u"a"_s));
    root.setText(u"x\u0001\u001f<&>\"'\u00e9\u20ac\t\r\n\ufffe]]>\U0001F697"_s + QChar(0xD800));
    EXPECT_EQ(document.xml(), u"<a>x&lt;&amp;&gt;\"'\u00e9\u20ac\t\r\n]]&gt;\U0001F697</a>"_s);
    root.setText(u"  "_s);
    EXPECT_TRUE(document.xml().endsWith(u">  </a>"_s));
}

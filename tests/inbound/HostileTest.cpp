// Loads messages in which each element in turn is missing, doubled or has an unexpected value.
#include "corpus/Targets.h"
#include "messages/Envelope.h"
#include "platform/files/CodePage.h"
#include "support/Messages.h"
#include "support/Test.h"

const QString leaves = u"//*[not(*)]"_s;

/// Returns the message, and all variants that differ from it in a single element.
static QStringList variantsOf(QString text)
{
    QStringList wrong = linesOf("inbound/hostile-values.txt");
    wrong << QString() << QString(100'000, u'7');  // longer than any column
    QStringList variants{text};
    const auto changed = [&](qsizetype leaf, auto change) {
        xml::Document message = parsedMessage(text);
        change(message, message.selectNodes(leaves)[leaf]);
        variants += message.xml();
    };
    const qsizetype count = parsedMessage(text).selectNodes(leaves).size();
    for (qsizetype leaf = 0; leaf < count; ++leaf) {
        changed(leaf, [](xml::Document& message, xml::Node element) {
            message.createNode(xml::NodeType::Element, u"nowhere"_s).appendChild(element);
        });
        changed(leaf, [](xml::Document& message, xml::Node element) {
            const QString name = element.nodeName();
            const QString space = name.contains(u':') ? GetNamespaceURI() : QString();
            xml::Node twin = message.createNode(element.nodeType(), name, space);
            twin.setText(element.text());
            element.setText(u"2"_s);
            element.selectSingleNode(u".."_s).appendChild(twin);
        });
        for (const QString& value : wrong)
            changed(leaf, [&](xml::Document&, xml::Node element) { element.setText(value); });
    }
    return variants;
}

class Hostile : public ::testing::TestWithParam<QStringList> {};

TEST_P(Hostile, AMessageChangesItsOwnQuoteOrNothing)
{
    const std::unique_ptr<Target> load = makeTarget("load");
    for (const QString& message : variantsOf(Message::told(GetParam()[0]).text()))
        EXPECT_NO_THROW(load->take(files::toCodePage(message))) << message.left(3000);
}

INSTANTIATE_TEST_SUITE_P(Messages, Hostile, ::testing::ValuesIn(rowsIn("inbound/hostile-messages.txt")));

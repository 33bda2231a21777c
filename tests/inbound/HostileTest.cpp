// Loads messages in which each element in turn is missing, doubled or has an unexpected value, and messages whose text
// is damaged at random. KEST2_TEST_DAMAGED sets how many of the latter there are of each type.
#include "corpus/Targets.h"
#include "messages/Envelope.h"
#include "platform/files/CodePage.h"
#include "support/Messages.h"
#include "support/Test.h"

const QString leaves = u"//*[not(*)]"_s;

/// Returns the text with one to four pieces of it removed, doubled, or replaced by markup.
static QString damaged(QString text, QRandomGenerator& random)
{
    static const QString markup[] = {u"<"_s,      u">"_s,         u"&"_s,     u"\""_s,     u"</"_s,
                                     u"]]>"_s,    u"<![CDATA["_s, u"<!--"_s,  u"<?x ?>"_s, u"&#x0;"_s,
                                     u"\u0000"_s, u"\ufffe"_s,    u"-9e99"_s, u"'"_s,      u"<!DOCTYPE a>"_s};
    for (int change = random.bounded(1, 5); change > 0; --change) {
        const int at = random.bounded(int(text.size()));
        const int length = random.bounded(1, 30);
        const int kind = random.bounded(int(std::size(markup)) + 2);
        const QString piece = text.mid(at, length);
        text.replace(at, kind < 2 ? int(piece.size()) : kind % 2,
                     kind == 0   ? QString()
                     : kind == 1 ? piece + piece
                                 : markup[kind - 2]);
        if (text.isEmpty())
            break;
    }
    return text;
}

/// Returns the message, and all variants that differ from it in a single element, and damaged ones.
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
    QRandomGenerator random(20551);
    for (int left = qEnvironmentVariable("KEST2_TEST_DAMAGED", u"40"_s).toInt(); left > 0; --left)
        variants += damaged(text, random);
    return variants;
}

class Hostile : public ::testing::TestWithParam<Message> {};

TEST_P(Hostile, AMessageChangesItsOwnQuoteOrNothing)
{
    const std::unique_ptr<Target> load = makeTarget("load");
    for (const QString& message : variantsOf(GetParam().text()))
        EXPECT_NO_THROW(load->take(files::toCodePage(message))) << message.left(3000);
}

INSTANTIATE_TEST_SUITE_P(Messages, Hostile,
                         ::testing::Values(quoteRequest("QR2").images({"1"}), quoteMatch("500"), excessWaiver("500"),
                                           quoteDeletion("KQ1"), revisionRequest("QR1"), cancellation("QR1"),
                                           cancellationBackout("QR1"), adjustedQuote("500"), assessmentResult("KQ1"),
                                           assessmentBackout("QR1"),
                                           authorisedQuote("500").labour(1, "C").sublet(2, "I"),
                                           manualQuote("500").part(1, "I").paint(2, "I")));

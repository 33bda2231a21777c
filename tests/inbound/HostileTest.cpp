// Loads messages in which each element in turn is missing, doubled or has an unexpected value, and messages whose text
// is damaged at random. KEST2_TEST_DAMAGED sets how many of the latter there are of each type.
#include "messages/Envelope.h"
#include "support/Shop.h"

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
        changed(leaf, [](xml::Document&, xml::Node element) { element.parentNode().removeChild(element); });
        changed(leaf, [](xml::Document& message, xml::Node element) {
            const QString name = element.nodeName();
            const QString space = name.contains(u':') ? GetNamespaceURI() : QString();
            xml::Node twin = message.createNode(element.nodeType(), name, space);
            twin.setText(u"2"_s);
            element.parentNode().insertBefore(twin, element);
        });
        for (const QString& value : wrong)
            changed(leaf, [&](xml::Document&, xml::Node element) { element.setText(value); });
    }
    QRandomGenerator random(20551);
    for (int left = qEnvironmentVariable("KEST2_TEST_DAMAGED", u"40"_s).toInt(); left > 0; --left)
        variants += damaged(text, random);
    return variants;
}

/// Removes the mark of a car that a message has changed, which is the only thing that is stored before a refusal.
static std::string withoutCarMark(const std::string& held)
{
    static const QRegularExpression mark(u"^(CAR REGO=.*) KEST=\\S+"_s, QRegularExpression::MultilineOption);
    return QString::fromStdString(held).replace(mark, u"\\1"_s).toStdString();
}

static QStringList linesAbout(const char* what, const std::string& held)
{
    return QString::fromStdString(held).split(u'\n').filter(QRegularExpression(QString::fromLatin1(what)));
}

static QString typeOf(const QString& message)
{
    return message.section(u"messageType>"_s, 1, 1);
}

class Hostile : public Shop, public ::testing::WithParamInterface<Message> {};

TEST_P(Hostile, AMessageChangesItsOwnQuoteOrNothing)
{
    const char* const bystander = "BYSTANDER";
    car(bystander).set("CUST_ID", customer(bystander).id());
    quote(bystander).rego(bystander).request(bystander).quoteNumber(bystander).line(1);
    quote("BYSTANDER2").rego(bystander).request("", "").quoteNumber("").line(1);
    files::write(gsUnsentPath + u"BYSTANDER.xml"_s, u"BYSTANDER"_s);
    quote("500").request("QR1").quoteNumber("KQ1").stage(3).note("Responded Quote Request").line(1);
    const QString ownType = typeOf(GetParam().text());
    const Snapshot before;
    const std::string held = holdings();
    const bool isMerged = ownType.startsWith(u"AUQT"_s) || ownType.startsWith(u"MANQ"_s);
    int takenCount = 0;
    const QStringList variants = variantsOf(GetParam().text());
    for (const QString& message : variants) {
        arrive("m.xml", message);
        const bool taken = loadAsTheWindow(u"m.xml"_s);
        const bool wasTold = !shown().empty();
        if (!taken)
            files::remove(gsUnreadPath + u"m.xml"_s);
        const std::string now = holdings();
        const std::string told = message.left(3000).toStdString();
        if (!taken) {
            if (!isMerged) {  // lines that were applied before a failure stay
                EXPECT_EQ(difference(withoutCarMark(held), withoutCarMark(now)), "\n") << told;
            }
            EXPECT_TRUE(wasTold || typeOf(message) != ownType) << told;  // an unknown type is ignored without a box
        }
        EXPECT_EQ(linesAbout("BYSTANDER", held), linesAbout("BYSTANDER", now)) << told;
        EXPECT_EQ(linesAbout("^/", now), linesAbout("^/wir(doc/A|img/)", now)) << told;
        if (now != held)
            before.restore();
        takenCount += taken;
    }
    EXPECT_GT(takenCount, 0);
    EXPECT_LT(takenCount, variants.size());
}

INSTANTIATE_TEST_SUITE_P(Messages, Hostile,
                         ::testing::Values(quoteRequest("QR2").images({"1"}), quoteMatch("500"), excessWaiver("500"),
                                           quoteDeletion("KQ1"), revisionRequest("QR1"), cancellation("QR1"),
                                           cancellationBackout("QR1"), adjustedQuote("500"), assessmentResult("KQ1"),
                                           assessmentBackout("QR1"),
                                           authorisedQuote("500").labour(1, "C").sublet(2, "I"),
                                           manualQuote("500").part(1, "I").paint(2, "I")));

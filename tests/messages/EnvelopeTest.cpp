// Tests the names of message types, and the repair of ampersands.
#include "messages/Envelope.h"
#include "support/Messages.h"
#include "support/Test.h"

const QString xsi = u"xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "_s;

TEST(Envelope, ATypeCodeHasItsDisplayNameInAnyCase)
{
    for (const auto& [code, name] : {std::pair("qreq", "Quote Request"),  // the tests of the list check the others
                                     {"EWAP", "Excess Waived/Already Paid"},
                                     {"QREQ ", "UNKNOWN - INVALID MESSAGE"}}) {
        QString text = Message(code, "getAnyResponse").text();
        EXPECT_EQ(GetMessageTypeName(text), QString::fromLatin1(name)) << code;
        EXPECT_TRUE(text.contains(xsi)) << "the caller's text comes back prepared";
    }
    QString broken = u"<a><messageType>QREQ</a>"_s;
    EXPECT_EQ(GetMessageTypeName(broken), u"UNKNOWN - INVALID MESSAGE"_s);
    QString marker = u"<m><mailtype>mdmsg</mailtype><action>DELDUPE</action></m>"_s;
    EXPECT_EQ(GetMarkerTypeName(marker), u"CORRUPT!"_s);
}

TEST(Envelope, AmpersandsAreEscapedAsFarAsAParseGoes)
{
    QString text = u"a & b &amp;"_s;
    EXPECT_TRUE(escapeAmpersands(text));
    EXPECT_EQ(text, u"a &amp; b &amp;amp;"_s);
    QString hostile(xml::Document::maximumBytes / 5 + 1, u'&');
    EXPECT_FALSE(escapeAmpersands(hostile));
    EXPECT_EQ(hostile.size(), xml::Document::maximumBytes / 5 + 1);
}

// Formats made-up messages, saves the text as the viewer does, and formats the file again.
#include "support/Chance.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"
#include "utilities/FormatXML.h"

namespace {

/// Writes elements that contain either characters or elements, as messages do. Characters never include "<" or "]]>",
/// which a save does not escape.
class MessageWriter {
public:
    MessageWriter(quint32 seed, bool hasOneRoot) : chance(seed), ampersands(hasOneRoot) {}

    QString element(int depth)
    {
        const QString name = chance.one({u"a"_s, u"p:b"_s, u"request"_s, u"\u00e9"_s, u"c.d-1"_s});
        return u'<' + name + attributes(depth == 0) + u'>' + content(depth) + u"</"_s + name + u'>';
    }

private:
    QString attributes(bool isRoot)
    {
        QString all = isRoot ? u" xmlns:p='urn:p'"_s : QString();
        if (chance.once(4))
            all += u" x='"_s + characters() + u'\'';
        if (chance.once(6))
            all += u" xmlns:q='urn:q' q:y=''"_s;
        return all;
    }
    QString content(int depth)
    {
        QString all;
        const bool isLeaf = depth == 4 || chance.once(3);
        for (int part = chance.number(0, 4); part > 0; --part)
            if (!isLeaf)
                all += chance.one({u""_s, u"\n\t"_s, u"\r\n "_s}) + element(depth + 1);
            else
                all += chance.once(2) ? section() : characters();
        return all;
    }
    QString section()
    {
        return u"<![CDATA["_s + chance.one({u"x"_s, u"]]"_s, u">y"_s, u"<b>"_s, u"]"_s, u" "_s}) + u"]]>"_s;
    }
    QString characters()
    {
        QString all;
        QStringList pieces{u"1"_s,  u" a b "_s, u"\u20ac\u00a0"_s, u"&gt;"_s, u"line\nend"_s,
                           u"\t"_s, u"/>"_s,    u"%1"_s,           u";"_s};
        if (ampersands)
            pieces += {u"A &amp; B"_s, u"&#38;"_s};
        for (int piece = chance.number(1, 3); piece > 0; --piece)
            all += chance.one(pieces);
        return all;
    }

    Chance chance;
    bool ampersands;  // the viewer does not read a bare one before a second root
};

}  // namespace

TEST(RoundTrip, AMessageThatIsSavedIsShownAsBefore)
{
    const TestProfile profile;
    const ScriptedDesktop desk;
    const QString file = u"c:\\m.xml"_s;
    for (quint32 seed = 0; seed < 1500; ++seed) {
        const bool hasOneRoot = seed % 7 != 0;
        MessageWriter writer(seed, hasOneRoot);
        QString message = writer.element(0);
        if (!hasOneRoot)  // as in an outbound document
            message += writer.element(0) + writer.element(0);
        files::write(file, message);
        const QString shown = FormatXML(file);
        ASSERT_FALSE(shown.isEmpty()) << message;
        files::write(file, withMarkupCharacters(withoutRequestWrapper(shown)));
        EXPECT_EQ(FormatXML(file), shown) << "seed " << seed << ": " << message;
    }
}

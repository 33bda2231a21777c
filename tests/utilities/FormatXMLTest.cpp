// Tests the text of the viewer: each kind of node, the two repairs, files that are not messages, and what has been
// saved.
#include "support/Chance.h"
#include "support/ScriptedDesktop.h"
#include "support/Test.h"
#include "utilities/FormatXML.h"

TEST(FormatXML, GivesEachElementItsLine)
{
    const test::TestProfile profile;
    const test::ScriptedDesktop desk;
    const QString file = u"c:\\m.xml"_s;
    QStringList boxes;
    for (const QStringList& row : test::rowsIn("format-xml.txt")) {
        files::writeBytes(file, row[0].toLatin1());
        EXPECT_EQ(FormatXML(file), row[1]) << row[0];
        if (row[1].isEmpty())
            boxes.append(u"critical||Error loading XML - Corrupt file?|ok"_s);
        EXPECT_EQ(desk.boxes(), boxes) << row[0];
    }
    files::remove(file);
    EXPECT_EQ(FormatXML(file), QString());
    EXPECT_EQ(desk.boxes().size(), boxes.size() + 1);
}

TEST(FormatXML, ShowsAMessageThatIsSavedAsBefore)
{
    const TestProfile profile;
    const ScriptedDesktop desk;
    const QString file = u"c:\\m.xml"_s;
    const Grammar messages("round-trip.txt");
    for (quint32 seed = 0; seed < 1500; ++seed) {
        Chance chance(seed);
        const auto message = [&] { return messages.text(chance, u"message"_s); };
        QString text = message();
        if (seed % 7 == 0) {  // several roots, as in an outbound document, where the viewer reads no bare ampersand
            text += message() + message();
            text.remove(QRegularExpression(u"&(amp|#38);"_s));
        }
        files::write(file, text);
        const QString shown = FormatXML(file);
        ASSERT_FALSE(shown.isEmpty()) << text;
        files::write(file, withMarkupCharacters(withoutRequestWrapper(shown)));
        EXPECT_EQ(FormatXML(file), shown) << "seed " << seed << ": " << text;
    }
}

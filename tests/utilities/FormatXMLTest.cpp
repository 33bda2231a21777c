// Tests the text of the viewer: each kind of node, the two repairs, and files that are not messages.
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

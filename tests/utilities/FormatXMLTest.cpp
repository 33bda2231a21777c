// The text of the viewer: each kind of node, the two repairs, and what is no message.
#include "platform/files/files.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"
#include "utilities/FormatXML.h"

namespace kest {

using namespace Qt::StringLiterals;

TEST(FormatXML, GivesEachElementItsLineAndRepairsTheTwoKnownFaults)
{
    const test::TestProfile profile;
    const test::ScriptedDesktop desk;
    const QString file = u"c:\\wirdoc\\AUnread\\m.xml"_s;
    files::makeFolder(u"c:\\wirdoc\\AUnread"_s);
    const QString corrupt;
    const std::pair<QByteArray, QString> cases[] = {
        {"<a x='1'/>", u"<a x=\"1\"></a>\r\n"_s},
        {"<?xml version='1.0'?><!-- before --><a>\n <b><c>  2 </c></b>\n <b/></a>",
         u"<a>\r\n\t<b>\r\n\t\t<c>  2 </c>\r\n\t</b>\r\n\t<b></b>\r\n</a>\r\n"_s},
        {"<a>text<b>1</b></a>", u"<a>text\t<b>1</b>\r\n</a>\r\n"_s},
        {"<a><b>1</b>text</a>", u"<a>\r\n\t<b>1</b>\r\ntext</a>\r\n"_s},
        {"<a><![CDATA[x < y]]></a>", u"<a><![CDATA[x < y]]></a>\r\n"_s},
        {"<a><b/><![CDATA[x]]></a>", u"<a>\r\n\t<b></b>\r\n<![CDATA[x]]></a>\r\n"_s},
        {"<p:a xmlns:p='u' p:x='&quot;&lt;'><!--note--><?go on?></p:a>",
         u"<p:a xmlns:p=\"u\" p:x=\"\"<\">\r\n\t<#comment>note</#comment>\r\n\t<go>on</go>\r\n</p:a>\r\n"_s},
        {"<a>1 &lt; 2 &amp; 3 caf\xe9</a>", u"<a>1 < 2 & 3 café</a>\r\n"_s},
        {"\xef\xbb\xbf<?xml version='1.0' encoding='utf-8'?><a>caf\xc3\xa9</a>", u"<a>café</a>\r\n"_s},
        {QByteArray("\xff\xfe<\0a\0>\0\xac\x20<\0/\0a\0>\0", 18), u"<a>€</a>\r\n"_s},
        {"<a>1</a><b>2</b>", u"<request>\r\n\t<a>1</a>\r\n\t<b>2</b>\r\n</request>\r\n"_s},
        {"<a>&amp; and &</a>", u"<a>&amp; and &</a>\r\n"_s},
        {"<a>1</a><b>A & B</b>", u"<request>\r\n\t<a>1</a>\r\n\t<b>A & B</b>\r\n</request>\r\n"_s},
        {"<a>A & B</a><b/>" /* wrapping comes first or not at all */, corrupt},
        {"", corrupt},
        {"plain text", corrupt},
        {"<a><b></a>", corrupt},
        {"<!DOCTYPE a [<!ENTITY e SYSTEM 'file:///etc/hostname'>]><a>&e;</a>", corrupt},
    };
    QStringList boxes;
    for (const auto& [content, expected] : cases) {
        files::writeBytes(file, content);
        EXPECT_EQ(FormatXML(file), expected) << content.toStdString();
        if (expected == corrupt)
            boxes.append(u"critical||Error loading XML - Corrupt file?|ok"_s);
        EXPECT_EQ(desk.boxes(), boxes) << content.toStdString();
    }
    files::remove(file);
    EXPECT_EQ(FormatXML(file), corrupt);
    EXPECT_EQ(desk.boxes().size(), boxes.size() + 1);
}

}  // namespace kest

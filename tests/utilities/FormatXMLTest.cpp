// The text of the viewer, for each kind of node, and the two repairs.
#include "platform/files/files.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"
#include "utilities/FormatXML.h"

namespace kest {

using namespace Qt::StringLiterals;
using test::ScriptedDesktop;
using test::TestProfile;

namespace {

const QString file = u"c:\\wirdoc\\AUnread\\m.xml"_s;

class Viewed : public ::testing::Test {
protected:
    Viewed() { files::makeFolder(u"c:\\wirdoc\\AUnread"_s); }

    static QString textOf(const QByteArray& content)
    {
        files::writeBytes(file, content);
        return FormatXML(file);
    }

    TestProfile profile;
    ScriptedDesktop desk;
};

}  // namespace

TEST_F(Viewed, EachKindOfNodeHasItsForm)
{
    const std::pair<QByteArray, QString> cases[] = {
        {"<a/>", u"<a></a>\r\n"_s},
        {"<a x='1'/>", u"<a x=\"1\"></a>\r\n"_s},
        {"<?xml version='1.0'?><!-- before --><a>1</a>", u"<a>1</a>\r\n"_s},
        {"<a><b>1</b><c>2</c></a>", u"<a>\r\n\t<b>1</b>\r\n\t<c>2</c>\r\n</a>\r\n"_s},
        {"<a>\n <b><c>  2 </c></b>\n</a>", u"<a>\r\n\t<b>\r\n\t\t<c>  2 </c>\r\n\t</b>\r\n</a>\r\n"_s},
        {"<a>text<b>1</b></a>", u"<a>text\t<b>1</b>\r\n</a>\r\n"_s},
        {"<a><b>1</b>text</a>", u"<a>\r\n\t<b>1</b>\r\ntext</a>\r\n"_s},
        {"<a><![CDATA[x < y]]></a>", u"<a><![CDATA[x < y]]></a>\r\n"_s},
        {"<a><b/><![CDATA[x]]></a>", u"<a>\r\n\t<b></b>\r\n<![CDATA[x]]></a>\r\n"_s},
        {"<p:a xmlns:p='u' p:x='&quot;&lt;'><!--note--><?go on?></p:a>",
         u"<p:a xmlns:p=\"u\" p:x=\"\"<\">\r\n\t<#comment>note</#comment>\r\n\t<go>on</go>\r\n</p:a>\r\n"_s},
        {"<a>1 &lt; 2 &amp; 3 caf\xe9</a>", u"<a>1 < 2 & 3 café</a>\r\n"_s},
    };
    for (const auto& [content, expected] : cases)
        EXPECT_EQ(textOf(content), expected) << content.toStdString();
    EXPECT_EQ(desk.boxTexts(), QStringList());
}

TEST_F(Viewed, SeveralRootsAreWrappedAndThenBareAmpersandsEscaped)
{
    const std::pair<QByteArray, QString> cases[] = {
        {"<a>1</a><b>2</b>", u"<request>\r\n\t<a>1</a>\r\n\t<b>2</b>\r\n</request>\r\n"_s},
        {"<a>Smith & Co</a>", u"<a>Smith & Co</a>\r\n"_s},
        {"<a>&amp; and &</a>", u"<a>&amp; and &</a>\r\n"_s},
        {"<a>1</a><b>A & B</b>", u"<request>\r\n\t<a>1</a>\r\n\t<b>A & B</b>\r\n</request>\r\n"_s},
    };
    for (const auto& [content, expected] : cases)
        EXPECT_EQ(textOf(content), expected) << content.toStdString();
    EXPECT_EQ(desk.boxTexts(), QStringList());
}

TEST_F(Viewed, WhatCannotBeReadIsSaidAndTheTextIsEmpty)
{
    const QByteArray cases[] = {
        "",
        "plain text",
        "<a><b></a>",
        "<a>A & B</a><b/>" /* wrapping comes first or not at all */,
        "<!DOCTYPE a [<!ENTITY e SYSTEM 'file:///etc/hostname'>]><a>&e;</a>",
    };
    QStringList boxes;
    for (const QByteArray& content : cases) {
        boxes.append(u"critical||Error loading XML - Corrupt file?|ok"_s);
        EXPECT_EQ(textOf(content), QString()) << content.toStdString();
        EXPECT_EQ(desk.boxes(), boxes) << content.toStdString();
    }
    EXPECT_EQ(FormatXML(u"c:\\wirdoc\\AUnread\\gone.xml"_s), QString());
    EXPECT_EQ(desk.boxes().size(), boxes.size() + 1);
}

}  // namespace kest

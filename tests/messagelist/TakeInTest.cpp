// Tests files that a person brings: which ones are copied, in which order, and what happens if a name is taken.
#include "messagelist/TakeIn.h"
#include "support/Shop.h"

using TakingIn = Shop;

TEST_F(TakingIn, OnlyWhatTheListKnowsIsTaken)
{
    quote("500");
    const QMap<QString, QString> contents{
        {u"request"_s, QString(quoteRequest("QR1").text()).replace("Alex"_L1, "Alex & Co"_L1)},
        {u"waiver"_s, excessWaiver("500").text()},
        {u"marker"_s, marker("500")},
        {u"response"_s, submissionResponse("KQ1").text()},
        {u"sent"_s, sentDocument("500")}};
    for (const auto& [name, content, refusal] : casesIn<3>("messages/taken-in.txt")) {
        const TakenIn taken = takeInFiles({bring(name, contents.value(content, content))});
        EXPECT_EQ(taken.refused.join(u' '), refusal.isEmpty() ? QString() : name + u": "_s + refusal);
        EXPECT_EQ(taken.messages + taken.pictures + taken.descriptions, refusal.isEmpty()) << name;
        EXPECT_EQ(files::exists(gsUnreadPath + name), refusal.isEmpty()) << name;
        EXPECT_TRUE(files::exists(root() + u"/stick/"_s + name));
    }
    QList<QUrl> others{QUrl::fromLocalFile(root()), QUrl::fromLocalFile(u"/nowhere/x.xml"_s),
                       QUrl(u"https://shop.example/a.xml"_s)};
    others.resize(12, others.last());
    EXPECT_TRUE(takeInFiles(others).refusals().startsWith(
        u"Not taken in:\n%1: it is a folder\nx.xml: there is no such file\n"
        "https://shop.example/a.xml: it is not on this computer\n"_s.arg(root().section(u'/', -1))));
    EXPECT_TRUE(takeInFiles(others).refusals().endsWith("\nand 2 more"_L1));
    EXPECT_EQ(shown(), "");
}

TEST_F(TakingIn, PicturesComeBeforeTheMessageThatNamesThem)
{
    const QList<QUrl> brought{bring(u"a.xml"_s, quoteRequest("QR1").images({"1"}).text()), bring(u"QR1_001.txt"_s, {}),
                              bring(u"QR1_001.jpg"_s, {})};
    QStringList counts;
    const TakenIn taken = takeInFiles(
        brought, [&](qint64 done, qint64) { counts.append(filesIn(gsUnreadPath).join(u' ') + QString::number(done)); });
    EXPECT_EQ(counts.join(u", "_s), u"QR1_001.jpg1, QR1_001.jpg QR1_001.txt2, a.xml QR1_001.jpg QR1_001.txt3"_s);
    EXPECT_EQ(taken.summary(), u"Taken in: 1 message, 1 picture, 1 description."_s);
}

TEST_F(TakingIn, AFileThatLiesThereIsReplacedOnlyAfterYes)
{
    arrive("a.xml", "old");
    const QUrl brought = bring(u"A.xml"_s, quoteRequest("QR1").text());
    EXPECT_EQ(takeInFiles({brought}).summary(), u"Nothing was taken in."_s);
    EXPECT_EQ(desktop->boxes(), QStringList(u"question||A.xml is already in the unread folder. Replace it?|no"_s));
    EXPECT_EQ(files::read(gsUnreadPath + u"a.xml"_s), u"old"_s);
    desktop.emplace(R"({"boxes": [{"text": "Replace", "answer": "yes"}]})");
    EXPECT_EQ(
        takeInFiles({brought, QUrl::fromLocalFile(files::systemPath(gsUnreadPath + u"a.xml"_s))}).refused.join(u' '),
        u"a.xml: it is already in the unread folder"_s);
    EXPECT_EQ(files::read(gsUnreadPath + u"a.xml"_s), files::read(brought.toLocalFile()));
    EXPECT_EQ(filesIn(gsUnreadPath).size(), 1);
    gsUnreadPath = u"c:\\gone\\"_s;
    EXPECT_EQ(takeInFiles({brought}).refused.size(), 1) << "what can't be copied is refused";
}

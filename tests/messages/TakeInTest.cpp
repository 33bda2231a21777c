// Files that a person brings: which are taken, in which order, and what becomes of one whose name is taken.
#include "messages/TakeIn.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/Shop.h"

namespace kest::test {
namespace {

using namespace Qt::StringLiterals;

class TakingIn : public Shop {
protected:
    /// The path of a file on the stick.
    QUrl bring(const QString& name, const QString& content)
    {
        files::makeFolder(root() + u"/stick"_s);
        files::write(root() + u"/stick/"_s + name, content);
        return QUrl::fromLocalFile(root() + u"/stick/"_s + name);
    }
};

TEST_F(TakingIn, OnlyMessagesAndWhatBelongsToRequestsAreTaken)
{
    const QString request = quoteRequest("QR1").text();
    const QString none = u"it is no message of the network"_s;
    quote("500");
    struct {
        QString name, content, refusal;
    } const cases[] = {
        {u"a.xml"_s, request, {}},
        {u"a.b.1_xml"_s, request, {}},
        {u"EWAP.xml"_s, excessWaiver("500").text(), {}},
        {u"amp.xml"_s, QString(request).replace("Kim"_L1, "Kim & Co"_L1), {}},
        {u"QR1_001.jpg"_s, u"picture"_s, {}},
        {u"QR1_002.JPG"_s, u"picture"_s, {}},
        {u"QR1_001.txt"_s, u"left door"_s, {}},
        {u"MDMSG_1.xml"_s, marker("500"), {}},
        {u"R_500_0.xml"_s, submissionResponse("KQ1").text(), {}},
        {u"R_501_0.xml"_s, submissionResponse("KQ1").text(), u"the quote that it answers is not there"_s},
        {u"R_500_0a.xml"_s, request, u"it is no response of the network"_s},
        {u"MDMSG_2.xml"_s, request, none},
        {u"other.xml"_s, u"<html/>"_s, none},
        {u"sent.xml"_s, sentDocument("500"), none},
        {u"half.xml"_s, request.left(100), u"it can't be read as XML"_s},
        {u"empty.xml"_s, {}, u"it can't be read as XML"_s},
        {u"b.XML"_s, request, u"the name of a message ends in small letters, \"xml\""_s},
        {u"holiday.jpg"_s, {}, u"its name is not that of a request's picture, such as 20551_001.jpg"_s},
        {u"letter.doc"_s, {}, u"it is no message, picture (.jpg) or description (.txt)"_s},
    };
    for (const auto& [name, content, refusal] : cases) {
        const TakenIn taken = TakeInFiles({bring(name, content)});
        EXPECT_EQ(taken.refused.join(u' '), refusal.isEmpty() ? QString() : name + u": "_s + refusal);
        EXPECT_EQ(taken.messages + taken.pictures + taken.descriptions, refusal.isEmpty()) << name.toStdString();
        EXPECT_EQ(files::exists(gsUnreadPath + name), refusal.isEmpty()) << name.toStdString();
        EXPECT_TRUE(files::exists(root() + u"/stick/"_s + name));
    }
    QList<QUrl> others{QUrl::fromLocalFile(root()), QUrl::fromLocalFile(u"/nowhere/x.xml"_s),
                       QUrl(u"https://shop.example/a.xml"_s)};
    others.resize(12, others.last());
    EXPECT_EQ(TakeInFiles(others).refusals().left(180).toStdString(),
              ("Not taken in:\n" + root().section(u'/', -1).toStdString() +
               ": it is a folder\nx.xml: there is no such file\n"
               "https://shop.example/a.xml: it does not lie on this computer\n"
               "https://shop.example/a.xml: it does not lie on this computer\n")
                  .substr(0, 180));
    EXPECT_TRUE(TakeInFiles(others).refusals().endsWith("\nand 2 more"_L1));
    EXPECT_EQ(shown(), "");
}

TEST_F(TakingIn, PicturesComeBeforeTheMessageThatNamesThem)
{
    const QList<QUrl> brought{bring(u"a.xml"_s, quoteRequest("QR1").images({"1"}).text()), bring(u"QR1_001.txt"_s, {}),
                              bring(u"QR1_001.jpg"_s, {})};
    QStringList counts;
    const TakenIn taken = TakeInFiles(
        brought, [&](qint64 done, qint64) { counts.append(filesIn(gsUnreadPath).join(u' ') + QString::number(done)); });
    EXPECT_EQ(counts.join(u", "_s), u"QR1_001.jpg1, QR1_001.jpg QR1_001.txt2, a.xml QR1_001.jpg QR1_001.txt3"_s);
    EXPECT_EQ(taken.summary(), u"Taken in: 1 message, 1 picture, 1 description."_s);
}

TEST_F(TakingIn, AFileThatLiesThereIsReplacedOnlyAfterYes)
{
    arrive("a.xml", "old");
    const QUrl brought = bring(u"A.xml"_s, quoteRequest("QR1").text());
    EXPECT_EQ(TakeInFiles({brought}).summary(), u"Nothing was taken in."_s);
    EXPECT_EQ(desktop->boxes(), QStringList(u"question||A.xml lies in the unread folder already. Replace it?|no"_s));
    EXPECT_EQ(files::read(gsUnreadPath + u"a.xml"_s), u"old"_s);
    desktop.emplace(R"({"boxes": [{"text": "Replace", "answer": "yes"}]})");
    EXPECT_EQ(
        TakeInFiles({brought, QUrl::fromLocalFile(files::systemPath(gsUnreadPath + u"a.xml"_s))}).refused.join(u' '),
        u"a.xml: it lies in the unread folder already"_s);
    EXPECT_EQ(files::read(gsUnreadPath + u"a.xml"_s), files::read(brought.toLocalFile()));
    EXPECT_EQ(filesIn(gsUnreadPath).size(), 1);
    gsUnreadPath = u"c:\\gone\\"_s;
    EXPECT_EQ(TakeInFiles({brought}).refused.size(), 1) << "what can't be copied is refused";
}

}  // namespace
}  // namespace kest::test

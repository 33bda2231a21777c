// Tests how much memory a message with a large document takes.
#include "messagelist/frmMessageList.h"
#include "support/Cost.h"
#include "support/Shop.h"

using LargeMessage = Shop;

TEST_F(LargeMessage, TakesLessThanFourTimesItsSizeInMemory)
{
    constexpr int bytes = 50'000'000;
    constexpr double most = 4.0 * bytes / (1 << 20);
    quote("500").request("QR1").line(1);
    {
        QByteArray text =
            authorisedQuote("500").sublet(2, "I", {{"subletAuthorityDocument", "AAAA"}}).text().toLatin1();
        files::writeBytes(gsUnreadPath + u"m.xml"_s, text.replace("AAAA", QByteArray(bytes, 'A')));
    }
    frmMessageList window;
    const Cost fill = costOf([&] { window.openUnread(); });
    const Cost load = costOf([&] { EXPECT_TRUE(window.loadFile(u"m.xml"_s)); });
    EXPECT_TRUE(fill.megabytes < most || !memoryIsReal) << fill.megabytes;
    EXPECT_TRUE(load.megabytes < most || !memoryIsReal) << load.megabytes;
    EXPECT_EQ(files::size(u"c:\\wirdoc\\PDF\\500.0_2.pdf"_s), bytes / 4 * 3);
    EXPECT_EQ(filesIn(gsReadPath), QStringList(u"500.0_1.xml"_s));
}

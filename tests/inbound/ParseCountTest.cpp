// Tests that a load parses its message only once.
#include "messagelist/frmMessageList.h"
#include "support/Shop.h"

#include <dlfcn.h>

int parses = 0;

/// Replaces the function of the parser.
extern "C" __attribute__((visibility("default"))) void* xmlCtxtReadIO(void* parser, void* feed, void* close,
                                                                      void* context, const char* url,
                                                                      const char* encoding, int options)
{
    using Read = void* (*)(void*, void*, void*, void*, const char*, const char*, int);
    static const auto read = reinterpret_cast<Read>(dlsym(RTLD_NEXT, "xmlCtxtReadIO"));
    ++parses;
    return read(parser, feed, close, context, url, encoding, options);
}

using ParseCount = Shop;

TEST_F(ParseCount, ALoadParsesItsMessageOnce)
{
    for (const char* told : {"QREQ quoteRequestNumber=QR9", "QMQR", "RRQT", "QRCN", "BCQR", "ADQT", "AUQT", "ARES",
                             "BACA", "EWAP", "MANQ", "QTDL"}) {
        quote("500").request("QR1").quoteNumber("KQ1").line(1).set("qty", 1.0);
        arrive("m.xml", Message::told(told));
        frmMessageList window;
        window.openUnread();
        parses = 0;
        EXPECT_TRUE(window.loadFile(u"m.xml"_s)) << told << shown();
        EXPECT_EQ(parses, 1) << told;
        EXPECT_EQ(filesIn(gsUnreadPath), QStringList()) << told;
    }
}

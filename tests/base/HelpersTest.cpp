// Tests the small routines that read messages.
#include "base/Helpers.h"
#include "base/modLoggerEx.h"
#include "support/Test.h"

static QString result(const QString& routine, const QStringList& arguments)
{
    const QString text = arguments[0];
    const QString second = arguments.value(1);
    if (routine == u"ReplaceText"_s)
        return ReplaceText(text, second, arguments[2]);
    if (routine == u"PadZeroLeft"_s)
        return PadZeroLeft(text, second.toInt());
    if (routine == u"SafeVal"_s)
        return QString::number(SafeVal(text, second));
    if (routine == u"SplitQuoteRef"_s)
        return SplitQuoteRef(text).first + u',' + SplitQuoteRef(text).second;
    const std::map<QString, QString (*)(const QString&)> others{
        {u"NormaliseRego"_s, NormaliseRego},         {u"NormaliseQuoteRef"_s, NormaliseQuoteRef},
        {u"AlphaNumericOnly"_s, AlphaNumericOnly},   {u"QuoteClean"_s, QuoteClean},
        {u"GetExtensionUpper"_s, GetExtensionUpper}, {u"FormatNetworkDate"_s, FormatNetworkDate}};
    return others.at(routine)(text);
}

TEST(Helpers, ReadTextsAsTheTableSays)
{
    for (const QStringList& row : test::rowsIn("helpers.txt"))
        EXPECT_EQ(test::outcomeOf([&] { return result(row[0], row.mid(2)); }), row[1]) << row.join(u" | "_s);
    EXPECT_EQ(SafeVal(QString(500, u'9'), u"7"_s), 7);
    EXPECT_EQ(UtcToLocal(QDateTime(QDate(2024, 7, 1), QTime(0, 0, 5, 900))).time(), QTime(10, 0, 5));
}

// Tests which numbers, flags, dates and texts are read, refused and written.

#include "support/Test.h"

#include <cmath>

static QString read(const QString& what, const QString& text)
{
    if (what == u"number"_s)
        return numberText(toDouble(text));
    if (what == u"long"_s)
        return QString::number(toLong(text));
    if (what == u"integer"_s)
        return QString::number(toInteger(text));
    if (what == u"flag"_s)
        return toText(toBool(text));
    return what == u"date"_s ? toText(toDate(text)) : numberText(leadingNumber(text));
}

TEST(Values, AreReadOnlyFromTheFormsOfTheirKind)
{
    for (const QStringList& row : test::rowsIn("values.txt"))
        for (const QString& text : row.mid(2))
            EXPECT_EQ(test::outcomeOf([&] { return read(row[0], text); }), row[1]) << row[0] << ' ' << text;
    EXPECT_EQ(toDate(u"2024-05-06T10:20:30.123456Z"_s).time().msec(), 123);
    EXPECT_EQ(failureOf([] { toLong(std::nan("")); }), Overflow);
    EXPECT_EQ(failureOf([] { toDate(45000); }), TypeMismatch) << "a day's number is no date";
    EXPECT_EQ(failureOf([] { toDouble(QDate(2024, 1, 1)); }), TypeMismatch);
    const QVariant null;
    EXPECT_EQ(failureOf([&] { toDouble(null); }), NullValue);
    EXPECT_EQ(failureOf([&] { toBool(null); }), NullValue);
    EXPECT_EQ(failureOf([&] { toDate(null); }), NullValue);
    EXPECT_EQ(failureOf([&] { toText(null); }), NullValue);
    EXPECT_EQ(textOrEmpty(null), QString());
}

TEST(Values, AnyValueHasOneText)
{
    QStringList texts;
    for (const QVariant& value : {QVariant(u" as it is "_s), QVariant(qint64(-7)), QVariant(QDate(333, 1, 2)),
                                  QVariant(QDateTime(QDate(2024, 1, 2), QTime(0, 5)))})
        texts << toText(value);
    EXPECT_EQ(texts.join(u'|'), u" as it is |-7|02/01/0333|02/01/2024 12:05:00 AM"_s);
}

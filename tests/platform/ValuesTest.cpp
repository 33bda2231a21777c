// Numbers, flags, dates and texts: what is read, what is refused, what is written.
#include "platform/values.h"
#include "support/Failure.h"
#include "support/TestProfile.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

using namespace Qt::StringLiterals;
using namespace kest;
using test::failureOf;

TEST(Values, ANumberHasOneOfTheKnownForms)
{
    QStringList read;
    for (const char* text : {"12", " -30.25\r\n", "1,234.50", "12,345,678", "-.5", "5.", "+7", "1e3", "2.5E-2",
                             "1e-999", "0e999", "000012", "1e+2"})
        read << numberText(toDouble(QString::fromLatin1(text)));
    EXPECT_EQ(read.join(u' '), u"12 -30.25 1234.5 12345678 -0.5 5 7 1000 0.025 0 0 12 100"_s);

    for (const char* text : {"",   " ",   ".",    "-",  "1 2", "12,34", "1,2345", "1234,567", ",123", "1.2.3",  "1e",
                             "e5", "--1", "0x10", "$5", "(5)", "12a",   "1,",     "nan",      "inf",  "1.5,000"})
        EXPECT_EQ(failureOf([&] { toDouble(QString::fromLatin1(text)); }), TypeMismatch) << text;
    EXPECT_FALSE(numberIn(u"\u0661\u0662"_s)) << "digits of another script are no digits";
    EXPECT_EQ(failureOf([] { toDouble(u"1e999"_s); }), Overflow);
    EXPECT_EQ(failureOf([] { toDouble(QString(400, u'9')); }), Overflow);
    EXPECT_EQ(failureOf([] { toDouble(QVariant()); }), NullValue);
    EXPECT_EQ(failureOf([] { toDouble(QDate(2024, 1, 1)); }), TypeMismatch);
}

TEST(Values, WholeNumbersRoundHalvesToTheEvenOneAndKeepTheirRange)
{
    const std::pair<QVariant, qint64> longs[] = {
        {0.5, 0},  {1.5, 2},           {2.5, 2}, {-2.5, -2}, {u"3.49"_s, 3}, {2147483647, 2147483647},
        {true, 1}, {u"1,000"_s, 1000},
    };
    for (const auto& [value, expected] : longs)
        EXPECT_EQ(toLong(value), expected) << value.toString().toStdString();
    EXPECT_EQ(failureOf([] { toLong(2147483648LL); }), Overflow);
    EXPECT_EQ(failureOf([] { toLong(u"-2147483649"_s); }), Overflow);
    EXPECT_EQ(toInteger(32767.4), 32767);
    EXPECT_EQ(failureOf([] { toInteger(32768); }), Overflow);
    EXPECT_EQ(failureOf([] { toLong(std::nan("")); }), Overflow);
}

TEST(Values, AFlagIsAWordOrANumber)
{
    for (const QVariant& yes :
         {QVariant(u" TRUE "_s), QVariant(u"true"_s), QVariant(u"-1"_s), QVariant(0.1), QVariant(true)})
        EXPECT_TRUE(toBool(yes)) << yes.toString().toStdString();
    for (const QVariant& no : {QVariant(u"False"_s), QVariant(u"0.0"_s), QVariant(0), QVariant(false)})
        EXPECT_FALSE(toBool(no)) << no.toString().toStdString();
    EXPECT_EQ(failureOf([] { toBool(u"yes"_s); }), TypeMismatch);
    EXPECT_EQ(failureOf([] { toBool(QVariant()); }), NullValue);
}

TEST(Values, ADateIsTakenAsItIsWritten)
{
    const std::pair<QString, QString> dates[] = {
        {u"2024-05-06"_s, u"06/05/2024"_s},
        {u" 2024-05-06T10:20:30.5Z "_s, u"06/05/2024 10:20:30 AM"_s},
        {u"2024-05-06T23:00:00+10:00"_s, u"06/05/2024 11:00:00 PM"_s},
        {u"2024-05-06T23:00-0330"_s, u"06/05/2024 11:00:00 PM"_s},
        {u"2024-05-06 10:20"_s, u"06/05/2024 10:20:00 AM"_s},
        {u"6/5/2024"_s, u"06/05/2024"_s},
        {u"29/02/2024 2:05:09 pm"_s, u"29/02/2024 2:05:09 PM"_s},
        {u"6/5/2024 14:05"_s, u"06/05/2024 2:05:00 PM"_s},
        {u"6/5/2024 12:00 AM"_s, u"06/05/2024"_s},
        {u"6/5/2024 12:30 PM"_s, u"06/05/2024 12:30:00 PM"_s},
    };
    for (const auto& [text, expected] : dates) {
        EXPECT_EQ(toText(toDate(text)), expected) << text.toStdString();
        EXPECT_EQ(toDate(toText(toDate(text))).time().second(), toDate(text).time().second());
    }
    for (const char* text :
         {"", "2024", "2024-5-6", "6/5/24", "31/2/2024", "2023-02-29", "2024-13-01", "13/13/2024", "2024-05-06T",
          "2024-05-06T24:00", "2024-05-06T10", "2024-05-06 10:20 PM", "2024-05-06T10:20:30+1", "6/5/2024 13:00 PM",
          "6/5/2024 0:30 AM", "6/5/2024 10:60", "6/5/2024x", "6-5-2024", "0000-01-01"})
        EXPECT_EQ(failureOf([&] { toDate(QString::fromLatin1(text)); }), TypeMismatch) << text;
    EXPECT_EQ(toDate(u"2024-05-06T10:20:30.123456Z"_s).time().msec(), 123);
    EXPECT_EQ(failureOf([] { toDate(QVariant()); }), NullValue);
    EXPECT_EQ(failureOf([] { toDate(45000); }), TypeMismatch);
}

TEST(Values, NumbersAreWrittenAsGeneralText)
{
    QStringList written;
    for (const double number : {0.0, -0.0, 12.5, 100.0, -30.25, 0.5, 0.1 + 0.2, 1234567.891, 1e15, 1e-7, 1.0 / 3,
                                99.9999999999999999, 1e20, 1.5e-12})
        written << numberText(number);
    EXPECT_EQ(written.join(u' '),
              u"0 0 12.5 100 -30.25 0.5 0.3 1234567.891 1000000000000000 0.0000001 0.333333333333333 100 1E+20 "
              "1.5E-12"_s);
    EXPECT_EQ(failureOf([] { numberText(std::numeric_limits<double>::infinity()); }), Overflow);
}

TEST(Values, AnyValueHasOneText)
{
    QStringList texts;
    for (const QVariant& value :
         {QVariant(u" as it is "_s), QVariant(true), QVariant(false), QVariant(qint64(-7)), QVariant(2.50),
          QVariant(QDate(2024, 1, 2)), QVariant(QDateTime(QDate(2024, 1, 2), QTime(0, 0))),
          QVariant(QDateTime(QDate(2024, 1, 2), QTime(0, 5)))})
        texts << toText(value);
    EXPECT_EQ(texts.join(u'|'), u" as it is |True|False|-7|2.5|02/01/2024|02/01/2024|02/01/2024 12:05:00 AM"_s);
    EXPECT_EQ(failureOf([] { toText(QVariant()); }), NullValue);
    EXPECT_EQ(textOrEmpty(QVariant()), QString());
    EXPECT_EQ(shortDate(QDate(333, 1, 2)), u"02/01/0333"_s);
}

TEST(Values, TheLeadingNumberPassesOverWhatFollowsIt)
{
    const std::pair<QString, double> texts[] = {
        {u"12abc"_s, 12},  {u" - 3.5.1"_s, -3.5}, {u"abc"_s, 0}, {u""_s, 0},
        {u"1 2 3"_s, 123}, {u"1e2x"_s, 100},      {u"7e"_s, 7},  {u"2/3"_s, 2},
    };
    for (const auto& [text, expected] : texts)
        EXPECT_EQ(leadingNumber(text), expected) << text.toStdString();
}

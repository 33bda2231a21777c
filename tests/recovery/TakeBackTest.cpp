// The changes of a whole operation are taken back, except for what others use or have changed.
#include "base/History.h"
#include "platform/RuntimeError.h"
#include "recovery/TakeBack.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

struct TakeBackOfALoad : Shop {
    TakeBackOfALoad()
    {
        quote("500").request("QR1").quoteNumber("KQ1").stage(3).set("excess", 500).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        quote("500").line(4, "MIS").set("unitcost", 12);
        quote("500").remarks("O'Brien \\ says\r\nso", "p_remarks");
        quote("500", 1).quoteNumber("KQ2").line(1);
    }

    /// Loads a message and returns the load's operation.
    static qint64 loaded(const Message& message)
    {
        files::write(gsUnreadPath + u"m.xml"_s, message.text());
        EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s));
        return toLong(opened(u"SELECT MAX(Operation) AS newest FROM KESTOperation"_s).value(u"newest"_s));
    }

    /// All rows, without the files.
    static std::string rows()
    {
        QStringList lines = QString::fromStdString(holdings()).split(u'\n');
        lines.removeIf([](const QString& line) { return line.startsWith(u'/'); });
        return lines.join(u'\n').toStdString();
    }
};

}  // namespace

TEST_F(TakeBackOfALoad, LeavesAllRowsAsTheyWere)
{
    desktop.emplace(R"({"boxes": [{"text": "want to continue", "answer": "yes"}]})");
    vendor("Straightline Alignment");  // a new one would stay
    const std::string before = rows();
    for (const Message& message :
         {authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").paint(3, "I").sublet(4, "C"),
          manualQuote("500").labour(1, "I").part(2, "I"), cancellation("QR1"), excessWaiver("500"),
          assessmentResult("KQ1"), quoteDeletion("KQ1"), quoteDeletion("KQ2")}) {
        const qint64 operation = loaded(message);
        EXPECT_NE(rows(), before);
        EXPECT_EQ(recovery::obstaclesTo(operation), QStringList());
        EXPECT_EQ(recovery::takeBack(operation), QStringList());
        EXPECT_EQ(difference(before, rows()), "\n");
    }
}

TEST_F(TakeBackOfALoad, KeepsWhatOtherLoadsMayUse)
{
    const qint64 operation = loaded(quoteRequest("QR9").rego("NEW001"));
    const int counter = Row("CINFO", "1=1").value("QUOTE_VAL").toInt();
    EXPECT_EQ(recovery::takeBack(operation), QStringList());
    EXPECT_EQ(rowCount("QUOTE1", "KESTQRNo='QR9'") + rowCount("QUOTE3", "QTNNO NOT IN ('500')"), 0);
    EXPECT_EQ(rowCount("CAR", "REGO='NEW001'"), 1);
    EXPECT_EQ(rowCount("CUSTOMER", "CUST_ID IN (SELECT CUST_ID FROM CAR WHERE REGO='NEW001')"), 1);
    EXPECT_EQ(Row("CINFO", "1=1").value("QUOTE_VAL").toInt(), counter);
}

TEST_F(TakeBackOfALoad, LeavesARowThatSomeoneElseHasChangedWhole)
{
    // the load writes the line twice; of neither write anything may go
    const qint64 operation =
        loaded(authorisedQuote("500").set("excess", "400").labour(1, "C").paint(3, "I").part(2, "D"));
    quote("500").line(3).set("script", "by the host");
    quote("500").line(1).set("rrhour", 77);
    const std::string itemNumber = quote("500").line(3).text("itemno");

    const QStringList expected{u"QUOTE2"_s, u"QUOTE2"_s};
    const auto tables = [](const QStringList& sentences) {
        QStringList told;
        for (const QString& sentence : sentences)
            told += sentence.section(u' ', 3, 3);
        return told;
    };
    EXPECT_EQ(tables(recovery::obstaclesTo(operation)), expected);
    EXPECT_EQ(tables(recovery::takeBack(operation)), expected);
    EXPECT_TRUE(quote("500").line(3).shows("category=PAINT script=by the host"));
    EXPECT_EQ(quote("500").line(3).text("itemno"), itemNumber);
    EXPECT_EQ(quote("500").line(1).number("rrhour"), 77);
    EXPECT_TRUE(quote("500").line(2).shows("category=PRT rrhour=80")) << "the deleted line is back";
    EXPECT_EQ(quote("500").state(), "3 open KQ1 (01/02/2008 : Responded Quote Request)");
    EXPECT_EQ(quote("500").number("excess"), 500);
}

TEST_F(TakeBackOfALoad, LeavesANewQuoteThatSomeoneElseWorksOn)
{
    const std::function<void(const QString&)> uses[] = {
        [](const QString& number) { quote(number).line(9); },
        [](const QString& number) {
            addRow("QUOTE3", {{"QTNNO", number}, {"Subquote", 0}});
        },
        [](const QString& number) {
            addRow("DEBTOR", {{"QTNNO", number}});
        },
    };
    int request = 0;
    for (const auto& use : uses) {
        const qint64 operation = loaded(quoteRequest(u"QR9%1"_s.arg(++request)));
        const QString number = journal::entryOf(operation).number;
        use(number);
        const QStringList told{u"Quote %1/0 has lines, notes or an invoice from elsewhere and stays."_s.arg(number)};
        EXPECT_EQ(recovery::obstaclesTo(operation), told);
        EXPECT_EQ(recovery::takeBack(operation), told);
        EXPECT_NE(quote(number).notes(), "") << "with its notes, or nobody could send it";
    }
}

TEST_F(TakeBackOfALoad, CanBeInterruptedAtEachStatement)
{
    const std::string before = rows();
    for (int number = 1;; ++number) {
        const qint64 operation = loaded(authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D"));
        int statement = 0;
        db::setStatementFault([&] { return ++statement >= number; });
        const bool isWhole = attempt([&] { recovery::takeBack(operation); });
        db::setStatementFault({});
        EnsureConnection();  // a rollback that failed has closed it
        EXPECT_EQ(recovery::takeBack(operation), QStringList()) << "statement " << number;
        EXPECT_EQ(difference(before, rows()), "\n") << "statement " << number;
        if (isWhole)
            return;
    }
}

}  // namespace kest::test

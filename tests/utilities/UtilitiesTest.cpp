// The window on a quote's network fields: what it shows, what its buttons change, what a save stores.
#include "shell/SharedVariables.h"
#include "support/Hands.h"
#include "support/Shop.h"
#include "utilities/frmUtilities.h"

#include <QLineEdit>
#include <QPushButton>

namespace kest {

using namespace Qt::StringLiterals;
using test::quote;
using test::Shop;

namespace {

class Utilities : public Shop {
protected:
    /// Shows the window on quote 500 and works it.
    void work(const std::string& steps, const QString& subquote = u"0"_s)
    {
        desktop.emplace(("{\"windows\": {\"frmUtilities\": [[" + steps + "]]}}").c_str());
        frmUtilities::ShowForm(u"500"_s, subquote);
    }
    /// The texts of the named controls as they were last read, one after the other.
    std::string texts(const QString& controls) const
    {
        QStringList result;
        for (const QString& control : controls.split(u' '))
            result.append(desktop->read(control).toString());
        return result.join(u'|').toStdString();
    }
};

std::string set(const std::string& control, const std::string& text)
{
    return "{\"set\": \"" + control + "\", \"text\": \"" + text + "\"}, ";
}

const std::string save = R"({"click": "Command1"})";
const std::string readAll = R"({"read": true})";

}  // namespace

TEST_F(Utilities, ShowTheQuoteAndANullAsAnEmptyText)
{
    quote("500", 1)
        .request("QR1", "2")
        .quoteNumber("KQ1")
        .authorised("KA1")
        .set("AuthDate", QDate(2008, 3, 21))
        .stage(4)
        .locked(true)
        .note("Won Quote Request");
    work(readAll, u"1"_s);
    const QString all =
        u"txtQTNNO txtRego txtQRNo txtQRVer txtQuoteNo txtAuthNo txtClaimNo txtAuthDate txtJobStage "
        "txtInsurer txtRemarks"_s;
    EXPECT_EQ(texts(all),
              "500/1|ABC123|QR1|2|KQ1|KA1|7700001|21/03/2008|Authorised|KEST Universal Insurer|"
              "(01/02/2008 : Won Quote Request)");
    EXPECT_TRUE(desktop->read(u"chkReadOnly"_s, u"checked"_s).toBool());
    EXPECT_FALSE(desktop->read(u"chkExtraInfo"_s, u"checked"_s).toBool());

    quote("500").set("Job_stage", nullptr).set("INSURER_ID", 999).set("Claim", nullptr);
    work(readAll, {});
    EXPECT_EQ(texts(all), "500|ABC123|||||||||");
}

TEST_F(Utilities, ATabForEachSubquoteLoadsItsRowAndForgetsWhatWasTyped)
{
    quote("500").quoteNumber("MAIN");
    work(readAll);
    EXPECT_EQ(desktop->read(u"TabStrip1"_s, u"rows"_s), (QJsonArray{QJsonArray{u"Quote"_s, u"S0"_s}}));

    quote("500", 1).quoteNumber("FIRST");
    quote("500", 2).quoteNumber("SECOND").remarks("second");
    work(set("txtQuoteNo", "typed") + R"({"tab": "TabStrip1", "key": "S2"}, )" + readAll);
    EXPECT_EQ(desktop->read(u"TabStrip1"_s, u"rows"_s),
              (QJsonArray{QJsonArray{u"Quote"_s, u"S0"_s}, QJsonArray{u"Add.-1"_s, u"S1"_s},
                          QJsonArray{u"Add.-2"_s, u"S2"_s}}));
    EXPECT_EQ(texts(u"txtQuoteNo txtRemarks"_s), "SECOND|second");
    work(R"({"tab": "TabStrip1", "key": "S0"}, )" + readAll, u"1"_s);
    EXPECT_EQ(texts(u"txtQuoteNo"_s), "MAIN");
    EXPECT_EQ(quote("500").text("KESTQuoteNo"), "MAIN");
}

TEST_F(Utilities, UndoReloadsAndCloseWritesNothing)
{
    quote("500").quoteNumber("KQ1").remarks("as it was");
    const std::string typed = set("txtQuoteNo", "typed") + set("txtRemarks", "typed") + R"({"click": "chkReadOnly"}, )";
    work(typed + R"({"click": "Command3"}, {"click": "Command9"}, )" + readAll);
    EXPECT_EQ(texts(u"txtQuoteNo txtRemarks"_s), "KQ1|as it was");
    EXPECT_FALSE(desktop->read(u"chkReadOnly"_s, u"checked"_s).toBool());
    work(typed + R"({"click": "Command2"})");
    EXPECT_EQ(quote("500").text("KESTQuoteNo"), "KQ1");
    EXPECT_EQ(quote("500").notes(), "as it was");
}

TEST_F(Utilities, SaveStoresEveryFieldAndOpensTheHostsQuoteAnew)
{
    quote("500").quoteNumber("HOST");
    quote("500", 1).set("AuthDate", QDate(2008, 3, 21)).remarks("one\r\ntwo\u00a0three");
    gsQTNNO = u"500"_s;
    gsSubQuote = u"0"_s;
    work(set("txtQRNo", "QR9") + set("txtQRVer", "3") + set("txtQuoteNo", "KQ'9") + set("txtAuthNo", "KA9") +
             set("txtAuthDate", "22/4/2009") + set("txtClaimNo", "ABC 123") +
             R"({"click": "chkReadOnly"}, {"click": "chkExtraInfo"}, )" + save,
         u"1"_s);
    const auto saved = quote("500", 1);
    std::string stored;
    for (const char* column :
         {"KESTQRNo", "KESTQRVer", "KESTQuoteNo", "KESTAuthNo", "Claim", "AuthDate", "ReadOnly", "ExtraInfo"})
        stored += saved.text(column) + '|';
    EXPECT_EQ(stored, "QR9|3|KQ'9|KA9|ABC 123|22/04/2009|True|True|");
    EXPECT_EQ(saved.notes(), "one\r\ntwo\u00a0three");
    ASSERT_TRUE(grsQuote && !grsQuote->eof());
    EXPECT_EQ(grsQuote->text(u"KESTQuoteNo"_s), u"HOST"_s);

    work(set("txtAuthDate", "") + save, u"1"_s);
    EXPECT_TRUE(quote("500", 1).isNull("AuthDate"));
}

TEST_F(Utilities, ARowOfLongTextsThatIsMissingIsMadeWhereThereIsSomethingToStore)
{
    quote("500");
    gConn->execute(u"DELETE FROM QUOTE3"_s);
    work(save);
    EXPECT_EQ(test::rowCount("QUOTE3"), 0);
    work(R"({"click": "Command4"}, )" + save);
    EXPECT_EQ(quote("500").notes(), "(today : Sending KEST Quote) (today : Responded Quote Request)");
}

TEST_F(Utilities, AClaimNumberWithoutAPositiveNumberIsRefused)
{
    const std::pair<std::string, bool> cases[] = {
        {"7700001", true}, {"ABC 123", true}, {"-5", false},    {"ABC", false},
        {"0", false},      {"", false},       {"1.2.3", false},
    };
    for (const auto& [claim, accepted] : cases) {
        quote("500").claim("77").quoteNumber("before");
        work(set("txtClaimNo", claim) + set("txtQuoteNo", "after") + save + (accepted ? "" : ", " + readAll));
        EXPECT_EQ(desktop->boxes(),
                  accepted ? QStringList() : QStringList(u"critical||Invalid Claim Number Entered|ok"_s))
            << claim;
        EXPECT_EQ(quote("500").text("KESTQuoteNo"), accepted ? "after" : "before") << claim;
    }
}

TEST_F(Utilities, AStatusButtonRewritesTickNumberAndNotes)
{
    const std::string whole =
        "(01/02/2008 : Authorised Quote) (01/02/2008 : Tender Failed \"Reason : price\") "
        "(01/02/2008 : Quote Deleted \"Reason : mistake\") (01/02/2008 : Submitted KEST Quote) "
        "(01/02/2008 : Won Quote Request)";
    struct {
        const char* button;
        int subquote;
        bool locked;
        const char* quoteNumber;
        std::string notes;
    } const cases[] = {
        {"Command3", 0, false, "",
         "(01/02/2008 : Tender Failed \"Reason : price\") (01/02/2008 : Active Quote Request)"},
        {"Command3", 1, false, "", "(01/02/2008 : Tender Failed \"Reason : price\") (01/02/2008 : Won Quote Request)"},
        {"Command4", 0, true, "KQ1", "(01/02/2008 : Sending KEST Quote) (01/02/2008 : Responded Quote Request)"},
        {"Command4", 1, true, "KQ1", "(01/02/2008 : Sending KEST Quote) (01/02/2008 : Won Quote Request)"},
        {"cmdSubmitted", 0, true, "KQ1", "(01/02/2008 : Submitted KEST Quote) (01/02/2008 : Responded Quote Request)"},
        {"cmdWon", 1, true, "KQ1",
         "(01/02/2008 : Authorised Quote) (01/02/2008 : Submitted KEST Quote) (01/02/2008 : Won Quote Request)"},
        {"cmdDeleted", 0, true, "KQ1",
         "(01/02/2008 : Quote Deleted) (01/02/2008 : Deleted KEST Quote) (01/02/2008 : Responded Quote Request)"},
        {"cmdLoss", 1, true, "KQ1",
         "(01/02/2008 : Tender Failed) (01/02/2008 : Quote Deleted) (01/02/2008 : Deleted KEST Quote) "
         "(01/02/2008 : Loss Quote Request)"},
    };
    for (const auto& c : cases) {
        auto row = quote("500", c.subquote);
        row.quoteNumber("KQ1").authorised("KA1").stage(4).locked(!c.locked).remarks(whole);
        work("{\"click\": \"" + std::string(c.button) + "\"}, " + save, QString::number(c.subquote));
        EXPECT_EQ(row.notes(), c.notes) << c.button << c.subquote;
        EXPECT_EQ(row.locked(), c.locked) << c.button;
        EXPECT_EQ(row.text("KESTQuoteNo"), c.quoteNumber) << c.button;
        EXPECT_EQ(row.text("KESTAuthNo") + std::to_string(row.stage()), "KA14") << c.button;
    }

    quote("500").remarks("a remark");
    work(R"({"click": "Command4"}, {"click": "Command4"}, )" + save);
    EXPECT_EQ(quote("500").notes(), "(today : Sending KEST Quote) (today : Responded Quote Request) a remark");
}

TEST_F(Utilities, ASaveThatTheHostHasOvertakenIsReportedAndTheWindowStays)
{
    struct {
        const char* overtaken;
        std::string quoteNumber, notes;
    } const cases[] = {
        {"UPDATE QUOTE1 SET KESTQuoteNo='host' WHERE QTNNO='500'", "host", "before"},
        {"UPDATE QUOTE3 SET remarks='host' WHERE QTNNO='500'", "repaired", "host"},
    };
    for (const auto& [overtaken, quoteNumber, notes] : cases) {
        quote("500").quoteNumber("before").remarks("before");
        QList<int> failures;
        desktop::setFailureReporter(
            [&](const RuntimeError& error, const QString&) { failures.append(error.number()); });
        QString left;
        const test::Hands hands({{u"frmUtilities"_s, [&](QDialog& window) {
                                      gConn->execute(QString::fromLatin1(overtaken));
                                      auto& number = test::control<QLineEdit>(window, "txtQuoteNo");
                                      number.setText(u"repaired"_s);
                                      test::control<QPushButton>(window, "Command4").click();
                                      test::control<QPushButton>(window, "Command1").click();
                                      left = window.isVisible() ? number.text() : QString();
                                  }}});
        frmUtilities::ShowForm(u"500"_s, u"0"_s);
        desktop::setFailureReporter(nullptr);
        EXPECT_EQ(failures, QList<int>{RowChanged}) << overtaken;
        EXPECT_EQ(left, u"repaired"_s) << overtaken;
        EXPECT_EQ(quote("500").text("KESTQuoteNo"), quoteNumber) << overtaken;
        EXPECT_EQ(quote("500").notes(), notes) << overtaken;
    }
}

}  // namespace kest

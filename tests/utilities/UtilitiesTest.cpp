// Tests the utilities window: what it shows, what its buttons change, and what a save stores.
#include "support/Hands.h"
#include "support/Shop.h"
#include "utilities/frmUtilities.h"

struct Utilities : Shop {
    void work(const std::string& steps, const QString& subquote = u"0"_s)
    {
        desktop.emplace(("{\"windows\": {\"frmUtilities\": [[" + steps + "]]}}").c_str());
        frmUtilities::ShowForm(u"500"_s, subquote);
    }
    /// Shows the window for the quote 500 and operates it from code. Returns the reported errors with their sources.
    static QStringList failuresOf(const test::Hands::Work& work)
    {
        QStringList failures;
        desktop::setFailureReporter([&](const RuntimeError& error, const QString& source) {
            failures.append(source + u' ' + QString::number(error.number()));
        });
        const test::Hands hands({{u"frmUtilities"_s, work}});
        frmUtilities::ShowForm(u"500"_s, u"0"_s);
        desktop::setFailureReporter(nullptr);
        return failures;
    }
};

static std::string set(const std::string& control, const std::string& text)
{
    return "{\"set\": \"" + control + "\", \"text\": \"" + text + "\"}, ";
}

const std::string save = R"({"click": "Command1"})";

TEST_F(Utilities, ShowTheQuote)
{
    quote("500", 1).request("QR1", "2").quoteNumber("KQ1").authorised("KA1").note("Won Quote Request");
    quote("500", 1).set("AuthDate", QDate(2008, 3, 21)).stage(4).locked(true);
    quote("500").set("Job_stage", nullptr).set("INSURER_ID", 999).set("Claim", nullptr);
    for (const auto& [subquote, texts] : casesIn<2>("utilities-texts.txt")) {
        work(R"({"read": true})", subquote);
        for (const auto& [control, text] : pairsIn(texts))
            EXPECT_EQ(desktop->read(control).toString(), text) << control;
        EXPECT_EQ(desktop->read(u"chkReadOnly"_s, u"checked"_s).toBool(), subquote == "1"_L1);
        EXPECT_FALSE(desktop->read(u"chkExtraInfo"_s, u"checked"_s).toBool());
    }
}

TEST_F(Utilities, ATabForEachRowLoadsItUnlessItHasGone)
{
    quote("500", 2);  // the order of the rows does not matter
    quote("500").quoteNumber("MAIN");
    test::anotherQuote("500");
    quote("500", 1).quoteNumber("FIRST").remarks("first");
    const QStringList failures = failuresOf([](QDialog& window) {
        auto& tabs = control<QTabBar>(window, "TabStrip1");
        auto& number = control<QLineEdit>(window, "txtQuoteNo");
        QStringList shown;
        for (int tab = 0; tab < tabs.count(); ++tab)
            shown.append(tabs.tabText(tab) + u' ' + tabs.tabData(tab).toString());
        EXPECT_EQ(shown.join(u'|'), u"Quote S0|Add.-0 S0|Add.-1 S1|Add.-2 S2"_s);
        EXPECT_EQ(tabs.currentIndex(), 0);
        number.setText(u"typed"_s);
        tabs.setCurrentIndex(2);
        EXPECT_EQ(number.text(), u"FIRST"_s);
        EXPECT_EQ(control<QPlainTextEdit>(window, "txtRemarks").toPlainText(), u"first"_s);
        gConn->execute(u"DELETE FROM QUOTE1 WHERE QTNNO='500' AND SUBQUOTE='2'"_s);
        tabs.setCurrentIndex(3);
        EXPECT_EQ(tabs.currentIndex(), 2);
        number.setText(u"repaired"_s);
        control<QPushButton>(window, "Command1").click();
    });
    EXPECT_EQ(failures, QStringList(u"frmUtilities.TabStrip1_Click 3021"_s));
    EXPECT_EQ(quote("500").text("KESTQuoteNo"), "MAIN");
    EXPECT_EQ(quote("500", 1).text("KESTQuoteNo"), "repaired");
}

TEST_F(Utilities, OnlySaveStoresWhatWasTyped)
{
    quote("500").quoteNumber("HOST");
    quote("500", 1).set("AuthDate", QDate(2008, 3, 21)).remarks("one\r\ntwo\u00a0three");
    gsQTNNO = u"500"_s;
    gsSubQuote = u"0"_s;
    std::string typed = R"({"click": "chkReadOnly"}, {"click": "chkExtraInfo"}, )";
    for (const auto& [control, text] : pairsIn(u"txtQRNo=QR9 txtQRVer=3 txtQuoteNo=KQ'9 txtAuthNo=KA9 "
                                               "txtAuthDate=22/4/2009 txtClaimNo=ABC 123"_s))
        typed += set(control.toStdString(), text.toStdString());
    const std::string before =
        "KESTQRNo= KESTQRVer= KESTQuoteNo= KESTAuthNo= Claim=7700001 AuthDate=21/03/2008 ReadOnly=0 ExtraInfo=0";
    const std::string after =
        "KESTQRNo=QR9 KESTQRVer=3 KESTQuoteNo=KQ'9 KESTAuthNo=KA9 Claim=ABC 123 AuthDate=22/04/2009 ReadOnly=1 "
        "ExtraInfo=1";
    for (const auto& [way, stored, box] : casesIn<3>("utilities-ways.txt")) {
        work(typed + way.toStdString(), u"1"_s);
        EXPECT_TRUE(quote("500", 1).shows(stored == u"typed"_s ? after : before)) << way;
        EXPECT_EQ(quote("500", 1).notes(), "one\r\ntwo\u00a0three") << way;
        EXPECT_EQ(desktop->boxTexts().join(u'|'), box) << way;
    }
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
    for (int time = 0; time < 2; ++time) {
        work(R"({"click": "Command4"}, )" + save);
        EXPECT_EQ(quote("500").notes(), "(today : Sending KEST Quote) (today : Responded Quote Request)");
    }
}

TEST_F(Utilities, AStatusButtonRewritesTheNotes)
{
    const QString old = u"01/02/2008 : "_s;
    const QString whole =
        u"(Authorised Quote) (Tender Failed \"Reason : price\") (Quote Deleted \"Reason : mistake\") "
        "(Submitted KEST Quote) (Won Quote Request)"_s;
    for (const auto& [button, subquote, state, notes] : test::casesIn<4>("utilities-buttons.txt")) {
        auto row = quote("500", subquote.toInt());
        row.quoteNumber("KQ1").authorised("KA1").stage(4).locked(state.startsWith(u"0"_s));
        row.remarks(QString(whole).replace(u'(', u'(' + old));
        work("{\"click\": \"" + button.toStdString() + "\"}, " + save, subquote);
        EXPECT_EQ(QString::fromStdString(row.notes()).remove(old), notes) << button << subquote.toInt();
        EXPECT_EQ(row.text("ReadOnly") + ' ' + row.text("KESTQuoteNo"), state.toStdString()) << button;
        EXPECT_EQ(row.text("KESTAuthNo") + ' ' + row.text("Job_stage"), "KA1 4") << button;
    }
}

TEST_F(Utilities, TheWindowStaysAfterASaveThatFails)
{
    const std::tuple<const char*, QString, int, std::string> cases[] = {
        {"UPDATE QUOTE1 SET KESTQuoteNo='host' WHERE QTNNO='500'", u""_s, RowChanged, "host|before"},
        {"UPDATE QUOTE3 SET remarks='host' WHERE QTNNO='500'", u""_s, RowChanged, "repaired|host"},
        {"DELETE FROM QUOTE2", u"no date"_s, TypeMismatch, "before|before"}};
    for (const auto& [meanwhile, date, failure, stored] : cases) {
        quote("500").quoteNumber("before").remarks("before");
        const QStringList failures = failuresOf([&](QDialog& window) {
            anotherConnection()->execute(QString::fromLatin1(meanwhile));
            control<QLineEdit>(window, "txtQuoteNo").setText(u"repaired"_s);
            control<QLineEdit>(window, "txtAuthDate").setText(date);
            control<QPushButton>(window, "Command4").click();
            control<QPushButton>(window, "Command1").click();
            EXPECT_TRUE(window.isVisible());
            EXPECT_EQ(control<QLineEdit>(window, "txtAuthDate").hasFocus(), failure == TypeMismatch);
        });
        EXPECT_EQ(failures, QStringList(u"frmUtilities.Command1_Click "_s + QString::number(failure))) << meanwhile;
        EXPECT_EQ(quote("500").text("KESTQuoteNo") + '|' + quote("500").notes(), stored) << meanwhile;
    }
}

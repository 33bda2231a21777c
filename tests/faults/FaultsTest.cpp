// What each operation of a shop leaves if one of its calls fails or the process dies there, and the user then goes on.
#include "Faults.h"
#include "base/CredentialCipher.h"
#include "jobexport/JobLinkSettings.h"
#include "jobexport/WriteQuote.h"
#include "messages/Folders.h"
#include "outbound/SendQuote.h"
#include "platform/Prompt.h"
#include "quotedata/QuoteTotals.h"
#include "recovery/Recovery.h"
#include "recovery/Undo.h"
#include "reports/PrintXML.h"
#include "support/MariaDbServer.h"
#include "utilities/frmLogin.h"
#include "utilities/frmUtilities.h"
#include "utilities/frmViewXML.h"

struct Loads : Faults {};

struct Lines : Faults {
    Lines()
    {
        quote("500").request("QR1").stage(3).set("excess", 500).set("contri", 50).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2).set("rr_rate2", 38).set("allow_tick", 7);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        quote("500").line(3, "OPG").set("pthour", 1).set("opg_rate", 48);
        quote("500").line(4, "MIS").set("unitcost", 12);
    }
};

struct Others : Faults {};

TEST_F(Loads, Requests)
{
    survivesLoading("RequestOfACustomerWithoutFirstName", quoteRequest("QR1").set("claimCustomer/firstName", ""));
    car("ABC123").set("COLOUR", "bLUE");
    survivesLoading("RequestOfKnownCar", quoteRequest("QR1").rego("ABC123"));
    arrive("QR1_001.jpg", "picture");
    arrive("QR1_001.txt", "its text");
    survivesLoading("Request", quoteRequest("QR1").images({"1"}));
}

TEST_F(Loads, StatusMessages)
{
    quote("500").request("QR1").quoteNumber("KQ1").stage(3).note("Responded Quote Request").line(1);
    quote("500").remarks("O'Brien \\ says\r\nso", "p_remarks");
    survivesLoadingAll("status");
    quote("500", 1).request("QR1").quoteNumber("KQ2").line(1);
    survivesLoading("DeletionOfASupplement", quoteDeletion("KQ2"),
                    R"({"boxes": [{"text": "DELETED", "answer": "yes"}]})");
    quote("500", 1).note("Quote Rejected \"Reason : Part Price\"");
    survivesLoading("RejectionBackout", assessmentBackout("QR1"));
}

TEST_F(Loads, BackoutOfAnAuthorisation)
{
    quote("500").request("QR1").authorised("KA1").stage(4).note("Won Quote Request").note("Authorised Quote");
    survivesLoading("AuthorisationBackout", assessmentBackout("QR1"));
}

TEST_F(Lines, AuthorisationsAndNewQuotes)
{
    survivesLoadingAll("lines");
}

TEST_F(Lines, ManualQuote)
{
    car("ABC123").set("COLOUR", "sILVER");
    arrive("waiting.xml", quoteRequest("QR1"));
    survivesLoading("ManualQuote", manualQuote("500").labour(1, "I").part(2, "I").paint(3, "I").sublet(4, "I"));
}

TEST_F(Lines, ManualQuoteWithBlanksInRego)
{
    car("ABC 123");
    car("ABC123").set("VIN", "in the way");
    quote("500").rego("ABC 123");
    survivesLoading("ManualQuoteWithBlanksInRego", manualQuote("500").labour(1, "I"));
}

TEST_F(Others, SubmissionResponse)
{
    quote("500").note("Sending KEST Quote");
    arrive("R_500_0.xml", submissionResponse("KQ1"));
    survives(u"SubmissionResponse"_s, {[] { openList(); }, [] { return quote("500").text("KESTQuoteNo") == "KQ1"; }});
}

TEST_F(Others, Fill)
{
    quote("500").request("QR1");
    arrive("a.xml", quoteRequest("QR2"));
    arrive("b.xml", cancellation("QR1"));
    arrive("c.xml", "<a>&</a>");
    const QString whole = u"b.xml|Quote Request Cancellation|ABC123|7700001|Ms Kim Holloway|500|CORELLA MERIDIAN GL"_s;
    static QStringList rows;
    survives(u"Fill"_s, {[] {
                             rows.clear();
                             rows = openList();
                         },
                         [whole] { return rows.size() == 3 && rows.contains(whole); }});
}

TEST_F(Others, Move)
{
    quote("500").request("QR1");
    arrive("m.xml", cancellation("QR1"));
    Work move = loadOf();
    move.doIt = [] { MoveMessage(u"m.xml"_s, u"read"_s); };
    survives(u"Move"_s, move);
}

TEST_F(Lines, Settling)
{
    arrive("m.xml", authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").paint(3, "I"));
    for (const int lost : {30, 1000}) {  // before and after the point of no return
        const auto isSettled = [] { return rowCount("KESTOperation", "State='open'") == 0; };
        survives(u"Settling"_s, {[] { openList(); }, isSettled,
                                 [lost] {
                                     EnsureConnection();
                                     int statement = 0;
                                     db::setStatementFault([&] { return ++statement >= lost; }, CannotOpen);
                                     attempt([] { loadAsTheWindow(u"m.xml"_s); });
                                     db::setStatementFault({});
                                     if (lost == 1000)  // the process dies before it can close the operation
                                         gConn->execute(u"UPDATE KESTOperation SET State='open'"_s);
                                 }});
    }
}

TEST_F(Lines, Undo)
{
    vendor("Straightline Alignment");  // a new one would stay
    static qint64 load;
    arrive("m.xml", authorisedQuote("500").set("excess", "400").labour(1, "C").part(2, "D").sublet(4, "I"));
    const auto isUnread = [] { return files::exists(gsUnreadPath + u"m.xml"_s); };
    survives(u"Undo"_s, {[=] {
                             if (isUnread())
                                 return;
                             for (const QString& sentence : recovery::undo(load).told)
                                 desktop::msgBox(sentence);  // as the window does
                         },
                         isUnread,
                         [] {
                             EnsureConnection();
                             EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s));
                             load = Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)").id();
                         }});
}

TEST_F(Lines, LoadBesideAnother)
{
    quote("501").request("QR501").stage(3).note("Responded Quote Request");
    arrive("m.xml", authorisedQuote("500").set("excess", "400").labour(1, "C").paint(3, "I"));
    arrive("n.xml", cancellation("QR501"));
    Work load = loadOf();
    load.doIt = [] { loadAsTheWindow(u"m.xml"_s); };
    load.meanwhile = [] {
        if (files::exists(gsUnreadPath + u"n.xml"_s))
            loadAsTheWindow(u"n.xml"_s);
        recovery::settle();
    };
    survives(u"LoadBesideAnother"_s, load);
}

TEST_F(Others, Send)
{
    for (const char* name : {"500_0001.jpg", "500_0002.jpg"})
        files::write(gsImagesPath + QLatin1StringView(name), QLatin1StringView(name));
    quote("500").request("QR1").note("Active Quote Request").line(1).set("rr_rate2", 50.255).set("rrhour", 2);
    const Work send{[] {
                        if (openHostQuote(u"500"_s, u"0"_s))
                            SendQuote(*grsQuote);
                    },
                    [] { return quote("500").locked(); }};
    survives(u"Send"_s, send);
    car("ABC123").set("Year", "1998");  // with right totals, the car's row is the first that changes
    openHostQuote(u"500"_s, u"0"_s);
    RoundQuoteLines(*grsQuote);
    survives(u"SendThatBeginsWithTheCar"_s, send);
}

TEST_F(Others, SaveInTheUtilities)
{
    quote("500").note("Responded Quote Request").locked(true);
    Work save{[] { frmUtilities::ShowForm(u"500"_s, u"0"_s); },
              [] { return quote("500").text("KESTQuoteNo") == "KQ5" && quote("500").notes().find("Sending") < 20; }};
    save.windows[u"frmUtilities"_s] = [](QDialog& window) {
        control<QLineEdit>(window, "txtQuoteNo").setText(u"KQ5"_s);
        control<QPushButton>(window, "Command4").click();
        control<QPushButton>(window, "Command1").click();
    };
    survives(u"SaveInTheUtilities"_s, save);
}

TEST_F(Others, SaveInTheViewer)
{
    arrive("m.xml", "<a>1</a><b>2</b>");
    Work save{[] {
                  gsCurFolder = gsUnreadPath;
                  frmViewXML::ShowForm(u"m.xml"_s);
              },
              [] { return files::read(gsUnreadPath + u"m.xml"_s).startsWith(u'\r'); }};
    save.windows[u"frmViewXML"_s] = [](QDialog& window) { control<QPushButton>(window, "Command2").click(); };
    save.windows[u"frmLogin"_s] = [](QDialog& window) {
        control<QLineEdit>(window, "txtPassword").setText(QString::number(dayPassword(QDate::currentDate())));
        control<QPushButton>(window, "cmdOK").click();
    };
    survives(u"SaveInTheViewer"_s, save);
}

TEST_F(Others, Print)
{
    quote("500").request("QR1").quoteNumber("KQ1");
    files::write(gsReadPath + u"m.xml"_s, assessmentResult("KQ1").text());
    putTemplate(720);
    const QString printed = root() + u"/printed.pdf"_s;
    survives(u"Print"_s, {[] {
                              gsListFolder = gsReadPath;
                              PrintXML(u"m.xml"_s, true);
                          },
                          [=] { return QFile::exists(printed); },
                          [=] { QFile::remove(printed); },
                          {},
                          "{}",
                          printing(u"frmPrintPreview"_s, printed, {})});
}

TEST_F(Others, Export)
{
    quote("500").line(1).set("tosend", "A").set("VENDOR", vendor("Spoiler World").id());
    quote("500").remarks("note", "anno_rr");
    const auto jobs = [](const char* select) {
        const auto link = std::make_shared<db::Connection>();
        link->open(mariaDb().connectionText(u"jobs"_s));
        db::Recordset found(link);
        found.open(QString::fromLatin1(select));
        QStringList rows;
        for (; !found.eof(); found.moveNext())
            for (const QString& column : found.columns())
                rows += column + u'=' + found.text(column);
        return rows;
    };
    InitCipherKey();
    storeJobLinkSettings({u"127.0.0.1"_s, mariaDb().port(), u"jobs"_s, mariaDb().user(), mariaDb().password()});
    survives(
        u"Export"_s,
        {[] { WriteQuote(u"500"_s, u"0"_s); }, [=] { return !jobs("SELECT * FROM newJob WHERE Status=1").isEmpty(); },
         [] { mariaDb().createDatabase(u"jobs"_s, files::read(checkoutFile(u"sql/joblink.sql"_s))); },
         [=] {
             return (jobs("SELECT lineNr, lineDescn FROM newJobDtl JOIN newJob ON nJobID_FK=nJobID_PK "
                          "JOIN newJobHdr USING (nJobID_FK) WHERE Status=1") +
                     jobs("SELECT COUNT(*) AS unfinished FROM newJob WHERE Status=0") +
                     jobs("SELECT COUNT(*) AS ofNoJob FROM newJobHdr WHERE nJobID_FK=0"))
                 .join(u'\n')
                 .toStdString();
         }});
}

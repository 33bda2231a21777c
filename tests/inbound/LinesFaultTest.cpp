// Authorised and manual quotes with every statement and file operation failing, and then again: the quote ends as if
// nothing had happened, or the test says why not.
#include "inbound/modLoadXML.h"
#include "shell/SharedVariables.h"
#include "support/FaultRun.h"

#include <QRegularExpression>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

using Known = FaultRun::KnownDifference;

bool shopHolds(const DisturbedLoad& load, const char* pattern)
{
    return QString::fromStdString(load.shop).contains(QRegularExpression(QString::fromLatin1(pattern)));
}

Known endsWith(const char* why, const char* pattern)
{
    return {why, [pattern](const DisturbedLoad& load) { return shopHolds(load, pattern); }};
}

// What both loads pass over, and so count as taken.

Known keepsItsName()
{
    return endsWith("the search for the new name failed, so the file moved under its old one", "/ARead/m.xml: ");
}

Known isFiledTwice()
{
    return endsWith("the message stood in both folders, and a second copy was filed", "/ARead/500.0_2.xml: ");
}

Known hasNoTotals()
{
    return {"totals that cannot be worked out or stored stay as they are, in silence", [](const DisturbedLoad& load) {
                return load.taken && shopHolds(load, "QUOTE1 [^$]* TOTAL=0 PRTTOTAL=0 MISTOTAL=0 ");
            }};
}

Known hasNoComparison()
{
    return {"a comparison that failed is passed over with its box, and adds no vendor for its lines",
            [](const DisturbedLoad& load) { return load.taken && load.boxes.find("error") != std::string::npos; }};
}

class DisturbedLines : public Shop {
protected:
    DisturbedLines()
    {
        quote("500").request("QR1").stage(3).set("excess", 500).set("contri", 50).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2).set("rr_rate2", 38).set("allow_tick", 7);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        quote("500").line(3, "OPG").set("pthour", 1).set("opg_rate", 48);
        quote("500").line(4, "MIS").set("unitcost", 12);
    }
};

}  // namespace

TEST_F(DisturbedLines, AnAuthorisationThatChangesAndDeletesLines)
{
    arrive("m.xml", authorisedQuote("500")
                        .set("excess", "400")
                        .set("customerContribution", "110")
                        .labour(1, "C", {{"labourType", "REPR"}})
                        .part(2, "C", {{"partQuantity", "2"}})
                        .paint(3, "C")
                        .sublet(4, "D"));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed({keepsItsName(), isFiledTwice(), hasNoComparison(), hasNoTotals()});
}

TEST_F(DisturbedLines, AnAuthorisationThatAddsLines)
{
    arrive("m.xml", authorisedQuote("500").labour(6, "I").sublet(7, "I", {{"subletAuthorityDocument", "JVBERi0x"}}));
    FaultRun(u"m.xml"_s)
        .expectAsIfNeverDisturbed({
            endsWith("the line's document lay there already", "/PDF/500.0_8.pdf: "),
            endsWith("a line that the first load added is added again", "SEQ_NO=6 [^$]* SEQ_NO=6 "),
            keepsItsName(),
            hasNoTotals(),
        });
}

TEST_F(DisturbedLines, AManualQuoteInThePlaceOfAnother)
{
    car("ABC123").set("COLOUR", "sILVER");
    arrive("waiting.xml", quoteRequest("QR1"));
    arrive("m.xml", manualQuote("500").labour(1, "I").part(2, "I").paint(3, "I").sublet(4, "I"));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed({isFiledTwice(), hasNoTotals()});
}

TEST_F(DisturbedLines, AManualQuoteThatIsNew)
{
    car("ABC123");
    arrive("m.xml", manualQuote("MANQ").request("QR9").labour(1, "I"));
    FaultRun(u"m.xml"_s)
        .expectAsIfNeverDisturbed(
            {endsWith("the message stood in both folders, and a second copy was filed", "/ARead/1001.0_2.xml: "),
             hasNoTotals()});
}

TEST_F(DisturbedLines, AManualQuoteWhoseCarWasTypedWithBlanks)
{
    car("ABC 123");
    car("ABC123").set("VIN", "in the way");
    quote("500").rego("ABC 123");
    arrive("m.xml", manualQuote("500").labour(1, "I"));
    FaultRun(u"m.xml"_s)
        .expectAsIfNeverDisturbed({
            {"the car took its new registration, and the quote did not, so the car now stands in its own way",
             [](const DisturbedLoad& load) { return !load.takenAgain && shopHolds(load, "CAR REGO=ABC123\\.\\. "); }},
            isFiledTwice(),
            hasNoTotals(),
        });
}

}  // namespace kest::test

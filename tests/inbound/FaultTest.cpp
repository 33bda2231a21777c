// Every load with every statement and file operation failing, and then again: what is as if nothing had happened, and
// what is not.
#include "inbound/modLoadXML.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/FaultRun.h"

namespace kest::test {

using namespace Qt::StringLiterals;
using DisturbedLoads = Shop;

namespace {

using Known = FaultRun::KnownDifference;

Known secondLoadSays(const char* why, const char* box)
{
    return {why, [box](const DisturbedLoad& load) { return load.boxesAgain.find(box) != std::string::npos; }};
}

Known endsWith(const char* why, const char* part)
{
    return {why, [part](const DisturbedLoad& load) { return load.shop.find(part) != std::string::npos; }};
}

/// What a taken message's move does when it cannot find the quote's number.
Known keepsItsName()
{
    return endsWith("the search for the new name failed, so the file moved under its old one", "/ARead/m.xml: ");
}

/// A message that was copied and could not be taken from the unread folder is loaded again.
Known isFiledTwice(const char* secondName)
{
    return endsWith("the message stood in both folders", secondName);
}

}  // namespace

TEST_F(DisturbedLoads, ARequest)
{
    std::vector<Known> known{
        keepsItsName(),
        secondLoadSays("the quote stands, so the request is known", "already exists as quote number 1001!"),
    };
    arrive("QR1_001.jpg", "picture");
    arrive("QR1_001.txt", "its text");
    arrive("m.xml", quoteRequest("QR1").images({"1"}));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed(known);

    car("ABC123").set("COLOUR", "bLUE");
    arrive("m.xml", quoteRequest("QR1").rego("ABC123"));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed(known);

    // Without a first name and a company name the new customer is not found by name, so a second one is made.
    known.push_back({"the customer stands without a car", [](const DisturbedLoad& load) { return load.takenAgain; }});
    arrive("m.xml", quoteRequest("QR1").set("claimCustomer/firstName", ""));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed(known);
}

TEST_F(DisturbedLoads, StatusMessagesChangeTheirNotesInPlace)
{
    quote("500").request("QR1").quoteNumber("KQ1").stage(3).note("Responded Quote Request").line(1);
    for (const Message& message : {quoteMatch("500"), excessWaiver("500"), revisionRequest("QR1"), cancellation("QR1"),
                                   cancellationBackout("QR1"), assessmentResult("KQ1"), assessmentBackout("QR1")}) {
        arrive("m.xml", message);
        std::vector<Known> known{keepsItsName(), isFiledTwice("/ARead/500.0_2.xml: ")};
        if (message.text().contains(u"EWAP"_s))
            known.clear();  // such a message keeps its name at all times
        FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed(known);
    }
}

TEST_F(DisturbedLoads, ADeletion)
{
    const Known gone =
        secondLoadSays("the network's number is gone from the quote", "Couldn't Locate Matching KEST Quote Number");
    quote("500").quoteNumber("KQ1").note("Responded Quote Request");
    arrive("m.xml", quoteDeletion("KQ1"));
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed({gone, keepsItsName()});

    quote("500", 1).quoteNumber("KQ2").line(1);
    arrive("m.xml", quoteDeletion("KQ2"));
    FaultRun(u"m.xml"_s, R"({"boxes": [{"text": "DELETED", "answer": "yes"}]})")
        .expectAsIfNeverDisturbed({gone, keepsItsName()});
}

TEST_F(DisturbedLoads, ABackOut)
{
    quote("500").request("QR1").authorised("KA1").stage(4).note("Won Quote Request").note("Authorised Quote");
    arrive("m.xml", assessmentBackout("QR1"));
    FaultRun(u"m.xml"_s)
        .expectAsIfNeverDisturbed({
            endsWith("the authorisation's number is gone, so it counts as a failed tender", "Fail Tender Backout"),
            keepsItsName(),
        });

    quote("500", 1).request("QR1").note("Quote Rejected \"Reason : Part Price\"");
    FaultRun(u"m.xml"_s).expectAsIfNeverDisturbed({keepsItsName(), isFiledTwice("/ARead/500.1_2.xml: ")});
}

TEST_F(DisturbedLoads, AnAdjustment)
{
    quote("500").request("QR1").line(1);
    arrive("m.xml", adjustedQuote("500"));
    FaultRun(u"m.xml"_s)
        .expectAsIfNeverDisturbed({
            {"the file stayed, and each load adds a note", [](const DisturbedLoad& load) { return load.taken; }},
        });
}

TEST_F(DisturbedLoads, ASubmissionResponse)
{
    quote("500").note("Sending KEST Quote");
    arrive("R_500_0.xml", submissionResponse("KQ1"));
    FaultRun(u"R_500_0.xml"_s, "{}", [](const QString& file) {
        return attempt([&] {
            QString text = files::read(gsUnreadPath + file);
            LoadSubmissionResponse(text, file);
        });
    }).expectAsIfNeverDisturbed();
}

}  // namespace kest::test

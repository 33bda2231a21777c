// The life of a request, from its load to its revision, with names and numbers that a statement could trip over.
#include "shell/SharedVariables.h"
#include "support/Load.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

using LifeOfARequest = Shop;

TEST_F(LifeOfARequest, FromItsLoadToItsRevision)
{
    gConn->execute(u"UPDATE INSURER SET excess_gst=NULL"_s);
    customer("O'Hara").set("FIRSTNAME", "Mary");

    EXPECT_TRUE(
        load(quoteRequest("QR\\1").set("claimCustomer/firstName", "Mary Jane").set("claimCustomer/surname", "O'HARA")));
    EXPECT_FALSE(load(quoteRequest("qr\\1")));
    EXPECT_EQ(shown(), "[critical] Quote Request already exists as quote number 1001!");
    EXPECT_EQ(quote("1001").text("excess_gst"), "2");
    EXPECT_EQ(car("XYZ789").number("CUST_ID"), customer("O'Hara").id());
    EXPECT_EQ(car("XYZ789").text("COLOUR"), "Blue");
    EXPECT_EQ(Row("CINFO", "1=1").text("QUOTE_VAL"), "1002");

    EXPECT_TRUE(load(cancellation("QR\\1").reason("it's \\ sold")));
    EXPECT_EQ(quote("1001").notes(), "(today : QR Cancelled - it's \\ sold) (today : Cancelled Quote Request)");
    EXPECT_TRUE(load(cancellationBackout("QR\\1")));
    EXPECT_TRUE(load(quoteMatch("1001").request("QR\\1")));
    EXPECT_TRUE(quote("1001").locked());
    EXPECT_TRUE(load(excessWaiver("1001/0")));
    EXPECT_TRUE(load(assessmentResult("KQ1")));
    EXPECT_EQ(quote("1001").stage(), 10);
    EXPECT_TRUE(load(assessmentBackout("QR\\1")));
    EXPECT_TRUE(load(revisionRequest("QR\\1")));
    EXPECT_TRUE(quote("1001").isNull("KESTQuoteNo"));
    EXPECT_FALSE(quote("1001").locked());
    EXPECT_TRUE(QString::fromStdString(quote("1001").notes()).endsWith(u"(today : Active Quote Request)"_s))
        << quote("1001").notes();

    shown();
    EXPECT_FALSE(load(quoteRequest("QR2").claim(std::string(1'000'000, '7')).rego("NEW1")));
    EXPECT_EQ(rowCount("CAR", "REGO='NEW1'"), 0);
}

}  // namespace kest::test

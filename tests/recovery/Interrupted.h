// A shop whose work is interrupted.
#pragma once

#include "base/History.h"
#include "base/Journal.h"
#include "outbound/Sending.h"
#include "recovery/Recovery.h"

namespace kest::test {

struct Interrupted : Sending {
    Interrupted()
    {
        quote("500").request("QR1").quoteNumber("KQ1").stage(3).set("excess", 500).note("Responded Quote Request");
        quote("500").line(1).set("rrhour", 2);
        quote("500").line(2, "PRT").set("qty", 1).set("rrhour", 80);
        quote("500").line(4, "MIS").set("unitcost", 12);
        quote("500").remarks("O'Brien \\ says\r\nso", "p_remarks");
        quote("500", 1).quoteNumber("KQ2").line(1);
        recovery::takeSettled();
    }
    ~Interrupted() override { db::setStatementFault({}); }

    static db::ConnectionPtr anotherConnection()
    {
        auto connection = std::make_shared<db::Connection>();
        connection->open(connectionText(driverNumber()));
        return connection;
    }

    static Row newest() { return Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)"); }
};

}  // namespace kest::test

// A shop whose work is interrupted.
#pragma once

#include "base/History.h"
#include "base/Journal.h"
#include "outbound/Sending.h"
#include "recovery/Recovery.h"

#include <QScopedValueRollback>

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

    /// Settles an operation whose folder is away, and then that of another workstation with a folder of its own.
    static void settleOutOfSight(QString& folder)
    {
        files::makeFolder(u"c:\\own"_s);
        for (const auto& [workstation, path] :
             {std::pair(GetComputerName(), u"c:\\gone\\"_s), {u"OTHER"_s, u"c:\\own\\"_s}}) {
            gConn->execute(sql("UPDATE KESTOperation SET Workstation='{}'", workstation));
            const QScopedValueRollback away(folder, path);
            recovery::settle();
            EXPECT_EQ(newest().text("State"), "unfinished") << path;
        }
    }

    static Row newest() { return Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)"); }
};

}  // namespace kest::test

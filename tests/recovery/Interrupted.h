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

    /// Settles an operation whose folder is away, and then as another workstation or profile with a folder of its own.
    static void settleOutOfSight(QString& folder)
    {
        const QString place = files::systemPath(folder);
        QDir().rename(place, place + u".away"_s);
        if (folder == gsImagesPath)
            QDir().mkdir(place);  // for a share that is not mounted
        recovery::settle();
        EXPECT_EQ(newest().text("State"), "unfinished");
        QDir().rmdir(place);
        QDir().rename(place + u".away"_s, place);

        files::makeFolder(u"c:\\own"_s);
        const QScopedValueRollback own(folder, u"c:\\own\\"_s);
        const char* older = "Workstation='OTHER', Facts=REPLACE(Facts, 'folders', 'not yet')";
        for (const char* change : {"Workstation=Workstation", older}) {
            plainRows(u"UPDATE KESTOperation SET "_s + QString::fromLatin1(change));
            recovery::settle();
            EXPECT_EQ(newest().text("State"), "unfinished") << change;
        }
    }

    static Row newest() { return Row("KESTOperation", "Operation=(SELECT MAX(Operation) FROM KESTOperation)"); }
};

}  // namespace kest::test

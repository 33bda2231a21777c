// The export of an interrupted load is made once, and a job that JobLink may have in part is told.
#include "base/CredentialCipher.h"
#include "base/Journal.h"
#include "inbound/modLoadXML.h"
#include "jobexport/JobLinkSettings.h"
#include "recovery/Recovery.h"
#include "support/MariaDbServer.h"
#include "support/Shop.h"

using InterruptedExport = Shop;

TEST_F(InterruptedExport, IsMadeUnlessItHasBegun)
{
    const struct {
        std::optional<int> status;  // of the job that the load has made, if its number is known
        QStringList statusAfter;    // of all jobs
        QStringList told;
        bool isMessageThere;
    } cases[] = {
        {{}, {u"1"_s}, {}, true},
        {{}, {u"1"_s}, {u"Its message has been removed or changed since, so it was not moved."_s}, false},
        {1, {u"1"_s}, {}, true},
        {0, {u"0"_s}, {u"JobLink may have only a part of job 1: check it there."_s}, true},
    };
    InitCipherKey();
    quote("500").line(1).set("tosend", "A");
    putTemplate(730);
    const db::ConnectionPtr jobs = std::make_shared<db::Connection>();
    const Snapshot before;
    for (const auto& [status, statusAfter, told, isMessageThere] : cases) {
        mariaDb().createDatabase(u"jobs"_s, files::read(checkoutFile(u"sql/joblink.sql"_s)));
        jobs->open(mariaDb().connectionText(u"jobs"_s));
        {  // without JobLink's settings nothing is exported yet
            QString text = authorisedQuote("500").labour(1, "C").text();
            files::write(gsUnreadPath + u"m.xml"_s, text);
            const journal::Operation operation(journal::Kind::Load, u"m.xml"_s, journal::hashOf(text));
            ASSERT_TRUE(LoadXML(text, u"m.xml"_s));
            if (status) {
                jobs->execute(u"INSERT INTO newJob SET Status=%1"_s.arg(*status));
                journal::keep(u"job"_s, 1);
            }
        }
        // as if the process had died, and the workstation had been renamed
        gConn->execute(u"UPDATE KESTOperation SET State='open', Workstation='OTHER'"_s);
        storeJobLinkSettings({u"127.0.0.1"_s, mariaDb().port(), u"jobs"_s, mariaDb().user(), mariaDb().password()});
        if (!isMessageThere)
            files::remove(gsUnreadPath + u"m.xml"_s);

        recovery::settle();

        const QList<recovery::Settled> settled = recovery::takeSettled();
        EXPECT_EQ(settled.value(0).left, told);
        QStringList found;
        db::Recordset rows(jobs);
        for (rows.open(u"SELECT Status FROM newJob"_s); !rows.eof(); rows.moveNext())
            found += rows.text(u"Status"_s);
        EXPECT_EQ(found, statusAfter);
        EXPECT_EQ(files::exists(gsUnreadPath + u"m.xml"_s), false);
        before.restore();
        EnsureConnection();
    }
}

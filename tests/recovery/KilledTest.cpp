// Processes that are killed at work: while another one works, and while they settle the work of a third.
#include "base/Journal.h"
#include "recovery/Recovery.h"
#include "support/Shop.h"

#include <QRegularExpression>

#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

struct KilledProcess : Shop {
    KilledProcess()
    {
        for (const char* number : {"500", "501"})
            quote(number).request(u"QR"_s + QLatin1StringView(number)).stage(3).note("Responded Quote Request");
        quote("500").set("excess", 500).line(1).set("rrhour", 2);
        arrive("QR9_001.jpg", "picture");
        for (const auto& [file, message] : messages())
            arrive(file, message);
    }

    static QList<std::pair<QString, Message>> messages()
    {
        return {{u"a.xml"_s, authorisedQuote("500").set("excess", "400").labour(1, "C").paint(3, "I")},
                {u"q.xml"_s, quoteRequest("QR9").images({"1"})}};
    }

    /// Lets the process die at a call of the database or of a file.
    static void dieAt(int number)
    {
        static int calls = 0;
        const auto die = [number] {
            if (++calls == number)
                ::_exit(0);
            return false;
        };
        db::setStatementFault(die);
        files::setFault(die);
    }

    /// Works in another process that dies at that call. Returns false if the work has fewer calls.
    static bool isKilled(int number, const std::function<void()>& work, const std::function<void()>& meanwhile = {})
    {
        closeConnections();
        const pid_t child = ::fork();
        if (child == 0) {
            dieAt(number);
            EnsureConnection();  // which settles what it finds
            attempt(work);
            ::_exit(1);
        }
        if (meanwhile) {
            EnsureConnection();
            meanwhile();
        }
        int status = 0;
        ::waitpid(child, &status, 0);
        EXPECT_TRUE(WIFEXITED(status));
        return WEXITSTATUS(status) == 0;
    }

    /// Waits until the server has noticed that the killed process is gone. Removes the temporary files of that process,
    /// as the next start after a day does.
    static void settle()
    {
        EnsureConnection();
        QDirIterator walk(profile::root() + u"/drive_c"_s, {u".kest-*.tmp"_s}, QDir::Files | QDir::Hidden,
                          QDirIterator::Subdirectories);
        while (walk.hasNext())
            QFile::remove(walk.next());
        for (int i = 0; i < 50 && rowCount("KESTOperation", "State='open'") > 0; ++i)
            recovery::settle();
    }

    static void loadIfItWaits(const QString& file)
    {
        EXPECT_TRUE(!files::exists(gsUnreadPath + file) || loadAsTheWindow(file)) << file;
    }

    /// All data, without the numbers of rows, which the database gives again only to the last.
    static std::string numberless()
    {
        static const QRegularExpression number(u"\\b(rec_id|CUST_ID|VENDOR|VENDOR_ID)=\\d+"_s);
        return QString::fromStdString(holdings()).replace(number, u"\\1=*"_s).toStdString();
    }
};

}  // namespace

TEST_F(KilledProcess, IsSettledAlsoIfTheSettlingIsKilled)
{
    int settlingsKilled = 0;
    const Snapshot before;
    for (const auto& [file, message] : messages()) {
        const auto load = [name = file] { loadAsTheWindow(name); };
        int calls = 1;
        for (const int stride : {10, 1}) {
            for (; isKilled(calls, load); calls += stride)
                before.restore();
            if (stride > 1) {
                before.restore();
                calls = std::max(calls - stride, 1);
            }
        }
        const std::string expected = numberless();
        for (const int loadCall : {calls / 2, calls - 20, calls - 6}) {  // before and after the point of no return
            const int step = shopIsOnServer() ? 10 : loadCall == calls / 2 ? 1 : 3;
            for (int call = 1;; call += step) {
                before.restore();
                EXPECT_TRUE(isKilled(loadCall, load));
                const bool isSettlingKilled = isKilled(call, [] {});
                settle();
                loadIfItWaits(file);
                EXPECT_EQ(difference(expected, numberless()), "\n") << file << ' ' << loadCall << ' ' << call;
                EXPECT_EQ(rowCount("KESTOperation", "State='interrupted'"), 0) << "nothing of it may be left";
                if (!isSettlingKilled)
                    break;
                ++settlingsKilled;
            }
        }
        before.restore();
    }
    EXPECT_GT(settlingsKilled, shopIsOnServer() ? 2 : 10);
}

TEST_F(KilledProcess, LeavesTheWorkOfAnotherAlone)
{
    arrive("b.xml", cancellation("QR501"));
    const Snapshot before;
    loadAsTheWindow(u"a.xml"_s);
    loadAsTheWindow(u"b.xml"_s);
    const std::string expected = numberless();
    int killed = 0;
    for (int call = 1;; call += 8) {
        before.restore();
        const bool isInterrupted = isKilled(
            call, [] { loadAsTheWindow(u"a.xml"_s); },
            [] {
                EXPECT_TRUE(loadAsTheWindow(u"b.xml"_s));
                recovery::settle();
            });
        settle();
        loadIfItWaits(u"a.xml"_s);
        EXPECT_EQ(difference(expected, numberless()), "\n") << call;
        if (!isInterrupted)
            break;
        ++killed;
    }
    EXPECT_GT(killed, 5);
}

}  // namespace kest::test

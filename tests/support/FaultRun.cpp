#include "support/FaultRun.h"

#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "platform/database/FaultInjection.h"
#include "platform/files/FaultInjection.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/Snapshot.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

void setFault(FaultOf of, std::function<bool()> fault)
{
    if (of == FaultOf::Statement)
        db::setStatementFault(std::move(fault));
    else
        files::setFault(std::move(fault));
}

std::string describe(const DisturbedLoad& load)
{
    return (load.of == FaultOf::Statement ? "statement " : "file operation ") + std::to_string(load.number) +
           (load.lasting ? " and all behind it" : "") + "\nfirst load: " + (load.taken ? "taken " : "not taken ") +
           load.boxes + "\nsecond load: " + (load.takenAgain ? "taken " : "not taken ") + load.boxesAgain;
}

}  // namespace

bool loadAsTheWindow(const QString& message)
{
    gsListFolder = gsUnreadPath;  // as after a fill: a load prints from there
    bool taken = false;
    attempt([&] {
        QString text = files::read(gsUnreadPath + message);
        taken = LoadXML(text, message);
    });
    if (taken)
        MoveMessage(message, u"read"_s);
    return taken;
}

FaultRun::FaultRun(const QString& message, const char* script, const std::function<bool(const QString& message)>& load)
{
    const Snapshot before;
    const auto loadOnce = [&](std::string& boxes) {
        const ScriptedDesktop desktop(script);
        const bool taken = !files::exists(gsUnreadPath + message) || load(message);
        boxes = desktop.boxTexts().join(u'\n').toStdString();
        return taken;
    };

    std::string boxes;
    EXPECT_TRUE(loadOnce(boxes)) << boxes;
    undisturbed_ = holdings();

    for (const FaultOf of : {FaultOf::Statement, FaultOf::FileOperation}) {
        for (const bool lasting : {false, true}) {
            for (int number = 1;; ++number) {
                before.restore();
                DisturbedLoad disturbed{of, number, lasting, false, {}, false, {}, {}};
                int step = 0;
                setFault(of, [&] {
                    ++step;
                    return lasting ? step >= number : step == number;
                });
                disturbed.taken = loadOnce(disturbed.boxes);
                setFault(of, {});
                if (step < number)
                    break;
                disturbed.takenAgain = loadOnce(disturbed.boxesAgain);
                disturbed.shop = holdings();
                loads_.push_back(disturbed);
            }
        }
    }
    before.restore();
}

void FaultRun::expectAsIfNeverDisturbed(const std::vector<KnownDifference>& known) const
{
    std::vector<int> seen(known.size());
    for (const DisturbedLoad& load : loads_) {
        if (load.takenAgain && load.shop == undisturbed_)
            continue;
        bool explained = false;
        for (size_t i = 0; i < known.size() && !explained; ++i) {
            explained = known[i].holds(load);
            seen[i] += explained;
        }
        EXPECT_TRUE(explained) << describe(load) << difference(undisturbed_, load.shop);
    }
    for (size_t i = 0; i < known.size(); ++i)
        EXPECT_GT(seen[i], 0) << "never comes up: " << known[i].why;
}

}  // namespace kest::test

#include "support/FaultRun.h"

#include "platform/database/FaultInjection.h"
#include "platform/files/FaultInjection.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/ScriptedDesktop.h"
#include "support/Snapshot.h"

#include <QRegularExpression>

#include <gtest/gtest.h>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

bool meets(const std::string& account, const char* pattern)
{
    const QRegularExpression expression(QString::fromLatin1(pattern), QRegularExpression::DotMatchesEverythingOption);
    return QString::fromStdString(account).contains(expression);
}

}  // namespace

void expectAsIfNeverDisturbed(const QString& message, const std::vector<KnownDifference>& known, const char* script,
                              const std::function<bool(const QString& message)>& load)
{
    const Snapshot before;
    bool taken = false;
    const auto loadOnce = [&] {
        const ScriptedDesktop desktop(script);
        taken = !files::exists(gsUnreadPath + message) || load(message);
        return (taken ? "taken\n" : "not taken\n") + desktop.boxTexts().join(u'\n').toStdString();
    };
    const std::string undisturbedLoad = loadOnce();
    EXPECT_TRUE(taken) << undisturbedLoad;
    const std::string undisturbed = holdings();

    std::vector<int> seen(known.size());
    const auto disturb = [&](const auto& setFault, const char* kind, bool lasting) {
        for (int number = 1;; ++number) {
            before.restore();
            int step = 0;
            setFault([&] {
                ++step;
                return lasting ? step >= number : step == number;
            });
            std::string account = "first load: " + loadOnce();
            setFault({});
            if (step < number)
                return;
            account += "\nsecond load: " + loadOnce();
            const std::string shop = holdings();
            if (taken && shop == undisturbed)
                continue;
            bool explained = false;
            for (size_t i = 0; i < known.size() && !explained; ++i) {
                explained = meets(account + '\n' + shop, known[i].second);
                seen[i] += explained;
            }
            EXPECT_TRUE(explained) << kind << ' ' << number << (lasting ? " and all behind it\n" : "\n") << account
                                   << difference(undisturbed, shop);
        }
    };
    for (const bool lasting : {false, true}) {
        disturb([](std::function<bool()> fault) { db::setStatementFault(std::move(fault)); }, "statement", lasting);
        disturb(files::setFault, "file operation", lasting);
    }
    before.restore();
    for (size_t i = 0; i < known.size(); ++i)
        EXPECT_GT(seen[i], 0) << "never comes up: " << known[i].first;
}

}  // namespace kest::test

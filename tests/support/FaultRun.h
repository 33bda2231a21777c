// Runs a load with each of its statements and file operations failing, and again without the fault.
#pragma once

#include "support/Shop.h"

#include <functional>
#include <string>
#include <vector>

namespace kest::test {

enum class FaultOf { Statement, FileOperation };

/// One load that was disturbed, and the same load again.
struct DisturbedLoad {
    FaultOf of;
    int number;    // of the step that failed first, from 1
    bool lasting;  // all steps from there on failed, not that one alone
    bool taken;
    std::string boxes;
    bool takenAgain;  // also true where nothing was left to load
    std::string boxesAgain;
    std::string shop;  // what the shop holds in the end
};

/// The window's way with a message, the move to the read folder included; false where a failure reaches the window.
bool loadAsTheWindow(const QString& message);

class FaultRun {
public:
    /// The shop as it stands now is where each load begins. The message lies in the unread folder.
    explicit FaultRun(const QString& message, const char* script = "{}",
                      const std::function<bool(const QString& message)>& load = loadAsTheWindow);

    /// A case in which the second load does not end as if the first had never been disturbed, and why.
    struct KnownDifference {
        const char* why;
        std::function<bool(const DisturbedLoad&)> holds;
    };
    /// Fails for each load that ends otherwise and is none of the known differences, and for each of those that never
    /// comes up.
    void expectAsIfNeverDisturbed(const std::vector<KnownDifference>& known = {}) const;

private:
    std::string undisturbed_;  // what the shop holds after a load without a fault
    std::vector<DisturbedLoad> loads_;
};

}  // namespace kest::test

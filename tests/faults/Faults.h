// Numbers every call of an operation that can fail: statements, connections, file operations, parsing and printing.
// Lets each of them fail, or ends the process there, and then goes on as a user would.
#pragma once

#include "support/Hands.h"
#include "support/Shop.h"

namespace kest::test {

/// Something that a user does, and can do again.
struct Work {
    std::function<void()> doIt;
    std::function<bool()> isDone;              // what the user sees in the shop: there is nothing left to do
    std::function<void()> prepare = [] {};     // what a shop's snapshot does not restore
    std::function<std::string()> result = {};  // what is compared, instead of the shop
    const char* answers = "{}";                // a script for the boxes
    std::map<QString, std::function<void(QDialog&)>> windows = {};  // what is done in each, which is not shown
    std::function<void()> meanwhile = {};                           // only if killed: what another process does then
};

/// The setting KEST2_TEST_FAULTS=all lets every call fail; otherwise every statement loses the connection, and every
/// tenth call has each other fault.
class Faults : public Shop {
public:
    static QStringList openList();
    static void loadFirst();

protected:
    /// Does the work undisturbed, and then with each fault at each of its calls: it fails once, it and all later calls
    /// fail, the connection is lost if it is a statement, and the process is killed before it. After each, the user
    /// goes on. Fails if the shop then differs from the one after the undisturbed work, unless
    /// tests/data/faults/deviations.txt has a reason for this name.
    void survives(const QString& name, const Work& work);

    /// A load of a message that has arrived as m.xml.
    static Work loadOf(const char* answers = "{}")
    {
        return {loadFirst, [] { return !files::exists(gsUnreadPath + QStringLiteral("m.xml")); }, [] {}, {}, answers};
    }
    void survivesLoading(const Text& name, const Message& message, const char* answers = "{}")
    {
        arrive("m.xml", message);
        survives(name, loadOf(answers));
    }
    /// Survives the loads of a group in tests/data/faults/loads.txt.
    void survivesLoadingAll(const char* group)
    {
        for (const QStringList& row : rowsIn("faults/loads.txt"))
            if (row[0] == QLatin1StringView(group))
                survivesLoading(row[1], Message::told(row[2]));
    }
};

}  // namespace kest::test

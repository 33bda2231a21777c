// The parts of the component that read what others have written, each with what must hold for every input. The corpus
// test gives them known hostile files, and the fuzz programs give them invented ones.
#pragma once

#include <QByteArray>

#include <memory>
#include <string>

namespace kest::test {

class Target {
public:
    virtual ~Target() = default;
    /// Reads an input. Throws std::logic_error if a promise is broken.
    virtual void take(const QByteArray& input) = 0;
};

inline constexpr const char* targetNames[] = {"xml",    "load",     "fill",  "notes",    "values", "viewer",
                                              "images", "template", "rules", "settings", "sublets"};
/// Creates a target with a shop of its own. Only one may exist at a time. index.txt says what each reads.
std::unique_ptr<Target> makeTarget(const std::string& name);

}  // namespace kest::test

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
/// Creates a target with a shop of its own. Only one may exist at a time.
///
///   xml       a message text: the parser and its repairs
///   load      a message, or lines that change a sample: "AUQT excess=400", "labour 1 C labourAmount=-1"
///   fill      files of a message folder, each after a line with "@" and its name
///   notes     a note chain, after lines with subject, status and detail
///   values    numbers and dates, one on each line
///   viewer    a message file
///   images    names of image files and messages, one on each line
///   template  a report template
///   rules     insurer.rules
///   settings  registry.ini
///   sublets   a PDF document, after a line with its name
std::unique_ptr<Target> makeTarget(const std::string& name);

}  // namespace kest::test

// A profile of its own for one test, in a temporary folder that goes with it.
#pragma once

#include <QString>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <iosfwd>

/// Found by argument-dependent look-up, so that a failed expectation shows the text.
void PrintTo(const QString& text, std::ostream* out);

namespace kest::test {

class TestProfile {
public:
    TestProfile();
    ~TestProfile();

    QString root() const { return folder.path(); }
    /// Where drive C: lies on this system.
    QString driveC() const { return folder.path() + QStringLiteral("/drive_c"); }

private:
    QTemporaryDir folder;
};

}  // namespace kest::test

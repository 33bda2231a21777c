// A profile of its own for one test, in a temporary folder that goes with it.
#pragma once

#include "platform/profile.h"

#include <QDir>
#include <QString>
#include <QTemporaryDir>

#include <gtest/gtest.h>

#include <iosfwd>

/// Found by argument-dependent look-up, so that a failed expectation shows the text.
void PrintTo(const QString& text, std::ostream* out);

namespace kest::test {

class TestProfile {
public:
    TestProfile()
    {
        EXPECT_TRUE(folder.isValid());
        QDir().mkpath(driveC());
        profile::setRoot(folder.path());
    }
    ~TestProfile() { profile::setRoot({}); }
    Q_DISABLE_COPY_MOVE(TestProfile)

    QString root() const { return folder.path(); }
    /// Where drive C: lies on this system.
    QString driveC() const { return folder.path() + QStringLiteral("/drive_c"); }

private:
    QTemporaryDir folder;
};

}  // namespace kest::test

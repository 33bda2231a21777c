// A profile for a single test, in a temporary folder that is deleted afterwards.
#pragma once

#include "platform/profile.h"
#include "platform/settings/registry.h"
#include "support/Places.h"

#include <QDir>
#include <QString>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace kest::test {

/// A profile that is the current one as long as it lives.
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
    /// Returns the folder of drive C: on this system.
    QString driveC() const { return folder.path() + QStringLiteral("/drive_c"); }

private:
    QTemporaryDir folder{memoryFolder(QStringLiteral("profile"))};
};

/// Sets a setting of the component for all users, or a value in another section of the registry's SOFTWARE.
inline void setSetting(const QString& name, const QString& text,
                       const QString& section = QStringLiteral("wirra32\\frmsplash"))
{
    const QString key = QStringLiteral("SOFTWARE\\") + section;
    EXPECT_TRUE(settings::createKey(settings::Hive::LocalMachine, key));
    EXPECT_TRUE(settings::setValue(settings::Hive::LocalMachine, key, name, {settings::Type::Text, text}));
}

}  // namespace kest::test

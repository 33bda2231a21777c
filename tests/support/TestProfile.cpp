#include "support/TestProfile.h"

#include "platform/profile.h"

#include <QDir>

namespace kest::test {

TestProfile::TestProfile()
{
    EXPECT_TRUE(folder.isValid());
    QDir().mkpath(driveC());
    profile::setRoot(folder.path());
}

TestProfile::~TestProfile()
{
    profile::setRoot({});
}

}  // namespace kest::test

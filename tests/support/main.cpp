// Runs a test program without the display, the drivers and the time zone of this machine.
#include "platform/desktop/ScratchSettings.h"
#include "support/OdbcDrivers.h"

#include <QApplication>

#include <gtest/gtest.h>

int main(int argc, char** argv)
{
    if (!qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    qputenv("TZ", "Australia/Sydney");  // on 4 October 2026 there is no time from 02:00 to 03:00
    using kest::test::OdbcDrivers;      // first, because ODBC reads the list of drivers only once
    const OdbcDrivers drivers(qgetenv("KEST2_TEST_ENGINE") == "tds" ? OdbcDrivers::WithSqlServer : OdbcDrivers::Own);
    const kest::desktop::ScratchSettings scratch;
    QApplication application(argc, argv);
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}

// Runs a test program without a display and without the drivers of this machine, and stops its servers at the end.
#include "support/MariaDbServer.h"
#include "support/OdbcDrivers.h"
#include "support/TdsServer.h"

#include <QApplication>

#include <gtest/gtest.h>

#include <ostream>

void PrintTo(const QString& text, std::ostream* out)
{
    *out << '"' << text.toStdString() << '"';
}

int main(int argc, char** argv)
{
    if (!qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    qputenv("TZ", "Australia/Sydney");  // on 4 October 2026 there is no time from 02:00 to 03:00
    using kest::test::OdbcDrivers;  // first, because ODBC reads the list of drivers only once
    const OdbcDrivers drivers(qgetenv("KEST2_TEST_ENGINE") == "tds" ? OdbcDrivers::WithSqlServer : OdbcDrivers::Own);
    QApplication application(argc, argv);
    ::testing::InitGoogleTest(&argc, argv);
    const int result = RUN_ALL_TESTS();
    kest::test::stopMariaDb();
    kest::test::stopTdsServer();
    return result;
}

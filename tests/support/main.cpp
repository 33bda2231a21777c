// Runs a test program: no display, nothing of this workstation's own drivers, servers of its own stopped at its end.
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
    using kest::test::OdbcDrivers;  // made first, since ODBC reads its list of drivers once
    const OdbcDrivers drivers(qgetenv("KEST2_TEST_ENGINE") == "tds" ? OdbcDrivers::WithSqlServer : OdbcDrivers::Own);
    QApplication application(argc, argv);
    ::testing::InitGoogleTest(&argc, argv);
    const int result = RUN_ALL_TESTS();
    kest::test::stopMariaDb();
    kest::test::stopTdsServer();
    return result;
}

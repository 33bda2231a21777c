#include "platform/settings/registry.h"
#include "shell/component.h"
#include "support/Shop.h"

#include <QFileInfo>
#include <QProcess>

#include <gtest/gtest.h>

namespace kest {
namespace {

using namespace Qt::StringLiterals;
using settings::Hive;

class Component : public test::Shop {
protected:
    /// What a host program prints on this shop's profile.
    QString host(const QStringList& arguments)
    {
        QProcess process;
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert(u"KEST2_PROFILE"_s, root());
        process.setProcessEnvironment(environment);
        process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        process.start(QStringLiteral(KEST_TEST_HOST), QStringList(QStringLiteral(KEST_LIBRARY)) + arguments);
        EXPECT_TRUE(process.waitForFinished());
        EXPECT_EQ(process.exitCode(), 0);
        return QString::fromLocal8Bit(process.readAll());
    }
};

TEST_F(Component, AHostWithoutQtCreatesAndReleasesIt)
{
    EXPECT_EQ(host({u"create"_s}), u"done\n"_s);
}

TEST_F(Component, TheHostsQuoteEnablesTheSend)
{
    test::quote("500");
    const QString others = u"ORLA Partner Network\nOption1(0)\nOption1(1) chosen\nOption1(2)%1\nOption1(3)\ndone\n"_s;
    EXPECT_EQ(host({u"show"_s, u"500"_s, u"0"_s}), others.arg(u""_s));
    EXPECT_EQ(host({u"show"_s, u"0"_s, u"1"_s}), others.arg(u""_s));
    EXPECT_EQ(host({u"show"_s, u"0"_s, u"0"_s}), others.arg(u" disabled"_s));
}

TEST_F(Component, RegistrationEntersTheClassAndTakesItOut)
{
    const QString key = u"CLSID\\"_s + com::text(CLSID_eKEST);
    ASSERT_EQ(DllRegisterServer(), com::Ok);
    const auto path = settings::query(Hive::ClassesRoot, key + u"\\InprocServer32"_s, u""_s);
    ASSERT_TRUE(path);
    EXPECT_TRUE(QFileInfo(path->data).fileName().startsWith(u"libkest2.so"_s));
    EXPECT_EQ(settings::query(Hive::ClassesRoot, u"KEST.eKEST\\CLSID"_s, u""_s)->data, com::text(CLSID_eKEST));
    ASSERT_EQ(DllRegisterServer(), com::Ok);
    ASSERT_EQ(DllUnregisterServer(), com::Ok);
    EXPECT_FALSE(settings::keyExists(Hive::ClassesRoot, key));
}

}  // namespace
}  // namespace kest

// Tests the binary interface with a host that loads the library.
#include "shell/component.h"
#include "support/Shop.h"

using settings::Hive;

struct Component : test::Shop {
    /// Runs a host program with the profile of this shop and returns what it prints.
    QString host(const QStringList& arguments, const QString& variables = u"QT_QPA_PLATFORM=offscreen"_s)
    {
        QProcess process;
        process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        const QString others = u"-u QT_QPA_PLATFORM -u DISPLAY -u WAYLAND_DISPLAY "_s;
        process.start(u"env"_s, (others + variables).split(u' ', Qt::SkipEmptyParts) +
                                    QStringList{u"KEST2_PROFILE="_s + root(), QStringLiteral(KEST_TEST_HOST),
                                                QStringLiteral(KEST_LIBRARY)} +
                                    arguments);
        EXPECT_TRUE(process.waitForFinished());
        EXPECT_EQ(process.exitCode(), 0);
        return QString::fromLocal8Bit(process.readAll());
    }
};

TEST_F(Component, AHostNeedsNoQt)
{
    EXPECT_EQ(host({u"create"_s}), u"done\n"_s);
}

TEST_F(Component, AHostThatCanShowNoWindowsSurvivesItsRefusal)
{
    EXPECT_EQ(host({u"refused"_s, u"core"_s}), u"refused\n"_s);
    for (const QString& variables :
         {u""_s, u"DISPLAY=:7999"_s, u"QT_QPA_PLATFORM=xcb DISPLAY=:7999"_s, u"QT_QPA_PLATFORM=nosuch"_s})
        EXPECT_EQ(host({u"refused"_s}, variables), u"refused\n"_s) << variables;
}

TEST_F(Component, TheCallAfterAFailureWorks)
{
    void* object = nullptr;
    ASSERT_EQ(DllGetClassObject(CLSID_eKEST, com::IID_IClassFactory, &object), com::Ok);
    auto* factory = static_cast<com::IClassFactory*>(object);
    ASSERT_EQ(factory->CreateInstance(nullptr, IID_IeKEST, &object), com::Ok);
    auto* component = static_cast<IeKEST*>(object);
    desktop.emplace(R"json({"windows": {"frmKEST": [[{"click": "cmdExit"}]]}})json");
    std::u16string none = u"0";
    kest::Text text = none.data();
    db::setStatementFault([]() -> bool { throw std::bad_alloc(); });
    EXPECT_EQ(component->ShowKESTWindow(&text, &text), com::OutOfMemory);
    db::setStatementFault({});
    EXPECT_EQ(component->ShowKESTWindow(&text, &text), com::Ok);
    component->Release();
    factory->Release();
}

TEST_F(Component, TheHostsQuoteEnablesTheSend)
{
    test::quote("500");
    const QString others = u"ORLA Partner Network\nOption1(0)\nOption1(1) chosen\nOption1(2)%1\nOption1(3)\ndone\n"_s;
    EXPECT_EQ(host({u"show"_s, u"500"_s, u"0"_s}), others.arg(u""_s));
    EXPECT_EQ(host({u"show"_s, u"0"_s, u"1"_s}), others.arg(u""_s));
    EXPECT_EQ(host({u"show"_s, u"0"_s, u"0"_s}), others.arg(u" disabled"_s));
}

TEST_F(Component, RegistrationCanBeUndone)
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

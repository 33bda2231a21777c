#include "shell/component.h"
#include "support/Shop.h"

using settings::Hive;

struct Component : test::Shop {
    /// Runs a host program with the profile of this shop and returns what it prints.
    QString host(const QStringList& arguments, const QString& platform = u"offscreen"_s, const QString& display = {})
    {
        QProcess process;
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        const std::pair<QString, QString> places[] = {
            {u"QT_QPA_PLATFORM"_s, platform}, {u"DISPLAY"_s, display}, {u"WAYLAND_DISPLAY"_s, {}}};
        for (const auto& [name, value] : places) {
            environment.remove(name);
            if (!value.isEmpty())
                environment.insert(name, value);
        }
        environment.insert(u"KEST2_PROFILE"_s, root());
        process.setProcessEnvironment(environment);
        process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        process.start(QStringLiteral(KEST_TEST_HOST), QStringList(QStringLiteral(KEST_LIBRARY)) + arguments);
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
    for (const auto& [platform, display] :
         {std::pair(u""_s, u""_s), {u""_s, u":7999"_s}, {u"xcb"_s, u":7999"_s}, {u"nosuch"_s, u""_s}})
        EXPECT_EQ(host({u"refused"_s}, platform, display), u"refused\n"_s) << platform;
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

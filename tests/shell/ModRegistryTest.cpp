#include "shell/ModRegistry.h"
#include "support/TestProfile.h"

#include <gtest/gtest.h>

namespace kest {
namespace {

using namespace Qt::StringLiterals;
using settings::Hive;
using settings::Type;

const QString splash = u"SOFTWARE\\wirra32\\frmsplash"_s;

class Settings : public ::testing::Test {
protected:
    static void machineWide(const QString& name, const settings::Value& value)
    {
        ASSERT_TRUE(settings::createKey(Hive::LocalMachine, splash));
        ASSERT_TRUE(settings::setValue(Hive::LocalMachine, splash, name, value));
    }
    static QString stored(const QString& name) { return RegGetValue(Hive::LocalMachine, splash, name); }
    static QString setting(const QString& name, const QString& fallback, CopyUp copyUp = CopyUp::Yes)
    {
        return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, name, fallback, copyUp);
    }

    test::TestProfile profile;
};

TEST_F(Settings, AMachineWideValueComesBeforeTheUsersAndTheDefault)
{
    settings::setUserSetting(u"wirra32"_s, u"frmsplash"_s, u"EcomHome"_s, u"user"_s);
    EXPECT_EQ(setting(u"EcomHome"_s, u"default"_s, CopyUp::No), u"user"_s);
    machineWide(u"EcomHome"_s, {Type::Text, u"machine"_s});
    EXPECT_EQ(setting(u"EcomHome"_s, u"default"_s), u"machine"_s);
    machineWide(u"EcomHome"_s, {Type::Text, u""_s});
    EXPECT_EQ(setting(u"EcomHome"_s, u"default"_s, CopyUp::No), u"user"_s);
}

TEST_F(Settings, TheFirstReadFixesADefaultForAllLaterOnes)
{
    EXPECT_EQ(setting(u"ServerName"_s, u"(local)"_s, CopyUp::No), u"(local)"_s);
    EXPECT_EQ(setting(u"Empty"_s, u""_s), u""_s);
    EXPECT_FALSE(settings::keyExists(Hive::LocalMachine, splash));
    EXPECT_EQ(setting(u"ImagesPath"_s, u"c:\\wirimg\\"_s), u"c:\\wirimg\\"_s);
    EXPECT_EQ(stored(u"ImagesPath"_s), u"c:\\wirimg\\"_s);
    EXPECT_EQ(setting(u"ImagesPath"_s, u"elsewhere"_s), u"c:\\wirimg\\"_s);
}

TEST_F(Settings, AValueIsReadByItsType)
{
    machineWide(u"number"_s, {Type::Number, u"0x1A"_s});
    machineWide(u"binary"_s, {Type::Binary, u"00ff"_s});
    machineWide(u"long"_s, {Type::Text, QString(2000, u'x')});
    EXPECT_EQ(stored(u"number"_s), u"26"_s);
    EXPECT_EQ(stored(u"binary"_s), u""_s);
    EXPECT_EQ(stored(u"long"_s).size(), 1023);
    EXPECT_EQ(RegGetValue(Hive::LocalMachine, splash, u"NUMBER"_s), u"26"_s);
}

TEST_F(Settings, AWriteKeepsTheTypeAndNeedsTheKey)
{
    EXPECT_FALSE(RegSetValue(Hive::LocalMachine, splash, u"a"_s, u"1"_s));
    machineWide(u"number"_s, {Type::Number, u"26"_s});
    EXPECT_TRUE(RegSetValue(Hive::LocalMachine, splash, u"number"_s, u"11.9 pieces"_s));
    EXPECT_FALSE(RegSetValue(Hive::LocalMachine, splash, u"number"_s, u"1e999"_s));
    EXPECT_EQ(settings::query(Hive::LocalMachine, splash, u"number"_s), (settings::Value{Type::Number, u"12"_s}));
    EXPECT_TRUE(RegSetValue(Hive::LocalMachine, splash, u"text"_s, u"12"_s));
    EXPECT_EQ(settings::query(Hive::LocalMachine, splash, u"text"_s), (settings::Value{Type::Text, u"12"_s}));
}

}  // namespace
}  // namespace kest

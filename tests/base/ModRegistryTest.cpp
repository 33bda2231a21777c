// Tests the settings of the host: the order of their places, and their types.
#include "base/ModRegistry.h"
#include "support/Test.h"

using settings::Hive;
using settings::Type;

const QString splash = u"SOFTWARE\\wirra32\\frmsplash"_s;

struct Settings : ::testing::Test {
    static void forTheUser(const QString& text)
    {
        const QString key = u"Software\\ApplicationSettings\\wirra32\\frmsplash"_s;
        settings::createKey(Hive::CurrentUser, key);
        settings::setValue(Hive::CurrentUser, key, u"EcomHome"_s, {Type::Text, text});
    }
    static QString stored(const QString& name) { return RegGetValue(Hive::LocalMachine, splash, name); }
    static bool store(const QString& name, const QString& text)
    {
        return RegSetValue(Hive::LocalMachine, splash, name, text);
    }
    static QString setting(const QString& fallback, CopyUp copyUp = CopyUp::Yes)
    {
        return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"EcomHome"_s, fallback, copyUp);
    }

    test::TestProfile profile;
};

TEST_F(Settings, TheFirstReadFixesAValueForTheMachine)
{
    EXPECT_EQ(setting(u"default"_s, CopyUp::No), u"default"_s);
    EXPECT_EQ(setting(u""_s), u""_s);
    EXPECT_FALSE(settings::keyExists(Hive::LocalMachine, splash));
    forTheUser(u"user"_s);
    EXPECT_EQ(setting(u"default"_s, CopyUp::No), u"user"_s);
    setSetting(u"EcomHome"_s, u""_s);
    EXPECT_EQ(setting(u"default"_s), u"user"_s);
    forTheUser(u"changed"_s);
    EXPECT_EQ(setting(u"elsewhere"_s), u"user"_s);
}

TEST_F(Settings, AValueHasItsType)
{
    EXPECT_FALSE(store(u"a"_s, u"1"_s)) << "the key must be there";
    setSetting(u"long"_s, QString(2000, u'x'));
    settings::setValue(Hive::LocalMachine, splash, u"number"_s, {Type::Number, u"0x1A"_s});
    settings::setValue(Hive::LocalMachine, splash, u"binary"_s, {Type::Binary, u"00ff"_s});
    EXPECT_EQ(stored(u"NUMBER"_s), u"26"_s);
    EXPECT_EQ(stored(u"binary"_s), u""_s);
    EXPECT_EQ(stored(u"long"_s).size(), 1023);
    EXPECT_TRUE(store(u"number"_s, u"11.9 pieces"_s));
    EXPECT_FALSE(store(u"number"_s, u"1e999"_s));
    EXPECT_TRUE(store(u"text"_s, u"12"_s));
    EXPECT_EQ(settings::query(Hive::LocalMachine, splash, u"number"_s), (settings::Value{Type::Number, u"12"_s}));
    EXPECT_EQ(settings::query(Hive::LocalMachine, splash, u"text"_s), (settings::Value{Type::Text, u"12"_s}));
}

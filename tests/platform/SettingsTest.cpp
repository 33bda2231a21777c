// The registry: names, types, any text, two writers at once, a profile that is not there.
#include "platform/profile.h"
#include "platform/settings/registry.h"
#include "support/TestProfile.h"

#include <QDir>
#include <QFile>

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace Qt::StringLiterals;
using namespace kest;
using namespace kest::settings;

namespace {

const QString key = u"SOFTWARE\\wirra32\\frmsplash"_s;

class Registry : public ::testing::Test {
protected:
    static QString text(const QString& name)
    {
        return query(Hive::LocalMachine, key, name).value_or(Value{Type::Binary, u"(none)"_s}).data;
    }
    QString file() const { return profile.root() + u"/registry.ini"_s; }

    test::TestProfile profile;
};

}  // namespace

TEST_F(Registry, NamesAreFoundInAnyCaseAndKeepTheirSpelling)
{
    createKey(Hive::LocalMachine, key);
    setValue(Hive::LocalMachine, key.toUpper() + u'\\', u"EcomHome"_s, {Type::Text, u"1"_s});
    setValue(Hive::LocalMachine, key, u"ECOMHOME"_s, {Type::Number, u"2"_s});
    const QList<Entry> all = entries();
    ASSERT_EQ(all.size(), 1);
    EXPECT_EQ(all[0].key, key);
    EXPECT_EQ(all[0].name, u"EcomHome"_s);
    EXPECT_EQ(all[0].value, (Value{Type::Number, u"2"_s}));
    EXPECT_EQ(query(Hive::LocalMachine, u"\\Software\\\\Wirra32\\FRMSPLASH"_s, u"ecomhome"_s), all[0].value);
}

TEST_F(Registry, AnyTextSurvives)
{
    const QStringList texts =
        u"| blanks |a=b:c|[x]|;x|@|50%25 %|a\r\nb\tc\n|\u00e9\u20ac\U0001F697|c:\\x\\|x\u0000y|\u0085|\""_s.split(u'|');
    ASSERT_EQ(texts.size(), 13);
    for (const QString& text : texts) {
        const QString place = u"SOFTWARE\\"_s + QString(text).replace(u'\\', u'/') + u"k"_s;
        ASSERT_TRUE(createKey(Hive::ClassesRoot, place));
        EXPECT_TRUE(setValue(Hive::ClassesRoot, place, text, {Type::Text, text}));
        EXPECT_EQ(query(Hive::ClassesRoot, place, text), (Value{Type::Text, text})) << text.toStdString();
        setUserSetting(u"an app"_s, u"a section"_s, text + u"1"_s, text);
    }
    for (const QString& text : texts)
        EXPECT_EQ(userSetting(u"AN APP"_s, u"A Section"_s, text + u"1"_s, u"fallback"_s), text) << text.toStdString();
    EXPECT_EQ(userSetting(u"an app"_s, u"other"_s, u"x"_s, u"fallback"_s), u"fallback"_s);
}

TEST_F(Registry, TwoProcessesWriteAtOnce)
{
    constexpr int each = 40;
    createKey(Hive::LocalMachine, key);
    const auto writeAll = [](const QString& who) {
        bool all = true;
        for (int i = 0; i < each; ++i)
            all = setValue(Hive::LocalMachine, key, who + QString::number(i), {Type::Text, who}) && all;
        return all;
    };
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0)
        ::_exit(writeAll(u"child"_s) ? 0 : 1);
    EXPECT_TRUE(writeAll(u"parent"_s));
    int status = -1;
    ASSERT_EQ(::waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
    for (int i = 0; i < each; ++i) {
        EXPECT_EQ(text(u"child"_s + QString::number(i)), u"child"_s);
        EXPECT_EQ(text(u"parent"_s + QString::number(i)), u"parent"_s);
    }
}

TEST_F(Registry, AFileWrittenByHandIsRead)
{
    QFile byHand(file());
    ASSERT_TRUE(byHand.open(QFile::WriteOnly));
    byHand.write(
        "; a remark\r\nstray=text:x\r\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\wirra32\\frmsplash]\r\n EcomHome "
        "=text:d:\\doc\\\r\n"
        "nonsense\r\nTabletUseMaster=number:1\r\n@=text:the default\r\n=\r\nx=unknown:1\r\n");
    byHand.close();
    EXPECT_EQ(text(u"EcomHome"_s), u"d:\\doc\\"_s);
    EXPECT_EQ(query(Hive::LocalMachine, key, u"TabletUseMaster"_s), (Value{Type::Number, u"1"_s}));
    EXPECT_EQ(text({}), u"the default"_s);
    EXPECT_EQ(entries().size(), 3);
}

TEST_F(Registry, WhatCannotBeReadIsEmptyAndIsNotOverwritten)
{
    createKey(Hive::LocalMachine, key);
    setValue(Hive::LocalMachine, key, u"a"_s, {Type::Text, u"1"_s});
    ::chmod(QFile::encodeName(file()).constData(), 0444);
    EXPECT_EQ(text(u"a"_s), u"1"_s);
    EXPECT_FALSE(setValue(Hive::LocalMachine, key, u"a"_s, {Type::Text, u"2"_s}));
    EXPECT_EQ(text(u"a"_s), u"1"_s);

    profile::setRoot(profile.root() + u"/missing"_s);
    EXPECT_EQ(text(u"a"_s), u"(none)"_s);
    EXPECT_EQ(entries().size(), 0);
    EXPECT_FALSE(createKey(Hive::LocalMachine, key));
    EXPECT_FALSE(setUserSetting(u"a"_s, u"b"_s, u"c"_s, u"d"_s));
    EXPECT_FALSE(QDir(profile::root()).exists());
}

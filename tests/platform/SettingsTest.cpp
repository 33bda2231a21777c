// Tests the registry: names, types, any text, two writers at once, and a missing profile.
#include "platform/settings/registry.h"
#include "support/Test.h"

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <ranges>

using namespace kest::settings;

const QString key = u"SOFTWARE\\wirra32\\frmsplash"_s;

struct Registry : ::testing::Test {
    Registry() { createKey(Hive::LocalMachine, key); }

    static bool set(const QString& name, const QString& text)
    {
        return setValue(Hive::LocalMachine, key, name, {Type::Text, text});
    }
    static QString text(const QString& name)
    {
        return query(Hive::LocalMachine, key, name).value_or(settings::Value{Type::Binary, u"(none)"_s}).data;
    }
    QString file() const { return profile.root() + u"/registry.ini"_s; }

    test::TestProfile profile;
};

TEST_F(Registry, NamesAreFoundInAnyCase)
{
    set(u"EcomHome"_s, u"1"_s);
    setValue(Hive::LocalMachine, key.toUpper() + u'\\', u"ECOMHOME"_s, {Type::Number, u"2"_s});
    const QList<Entry> all = entries();
    ASSERT_EQ(all.size(), 1);
    EXPECT_EQ(all[0].key + u' ' + all[0].name, key + u" EcomHome"_s);
    EXPECT_EQ(all[0].value, (settings::Value{Type::Number, u"2"_s}));
    EXPECT_EQ(query(Hive::LocalMachine, u"\\Software\\\\Wirra32\\FRMSPLASH"_s, u"ecomhome"_s), all[0].value);
}

TEST_F(Registry, AnyTextSurvives)
{
    const QString userKey = u"Software\\ApplicationSettings\\an app\\a section"_s;
    createKey(Hive::CurrentUser, userKey);
    for (const QString& text :
         u"| blanks |a=b:c|[x]|;x|@|50%25 %|a\r\nb\tc\n|\u00e9\u20ac\U0001F697|c:\\x\\|x\u0000y|\u0085|\""_s.split(
             u'|')) {
        EXPECT_TRUE(set(text, text));
        EXPECT_EQ(Registry::text(text), text) << text;
        setValue(Hive::CurrentUser, userKey, text + u"1"_s, {Type::Text, text});
        EXPECT_EQ(userSetting(u"AN APP"_s, u"A Section"_s, text + u"1"_s, u"fallback"_s), text) << text;
    }
    EXPECT_EQ(userSetting(u"an app"_s, u"other"_s, u"x"_s, u"fallback"_s), u"fallback"_s);
}

TEST_F(Registry, TwoProcessesWriteAtOnce)
{
    const auto writeAll = [](const QString& who) {
        const auto write = [&](int number) { return set(who + QString::number(number), who); };
        return std::ranges::all_of(std::views::iota(0, 40), write);
    };
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0)
        ::_exit(writeAll(u"child"_s) ? 0 : 1);
    EXPECT_TRUE(writeAll(u"parent"_s));
    ASSERT_EQ(::waitpid(child, nullptr, 0), child);
    EXPECT_EQ(entries().size(), 80);
}

TEST_F(Registry, AFileWrittenByHandIsRead)
{
    files::write(file(),
                 u"; a remark\r\nstray=text:x\r\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\wirra32\\frmsplash]\r\n"
                 " EcomHome =text:d:\\doc\\\r\nnonsense\r\n@=text:the default\r\n=\r\nx=unknown:1\r\n"_s);
    EXPECT_EQ(text(u"EcomHome"_s), u"d:\\doc\\"_s);
    EXPECT_EQ(text({}), u"the default"_s);
    EXPECT_EQ(entries().size(), 2);
}

TEST_F(Registry, TheFileIsItsOwnersAlone)
{
    const auto mode = [&] {
        struct stat state {};
        return ::stat(QFile::encodeName(file()).constData(), &state) == 0 ? state.st_mode & 0777U : 0;
    };
    EXPECT_EQ(mode(), 0600U) << "a new file";
    ::chmod(QFile::encodeName(file()).constData(), 0644);
    check();
    EXPECT_EQ(mode(), 0600U);
    ::chmod(QFile::encodeName(file()).constData(), 0664);
    set(u"a"_s, u"1"_s);
    EXPECT_EQ(mode(), 0600U);
}

TEST_F(Registry, AFileThatIsNoneIsKept)
{
    for (const QByteArray& damaged : {QByteArray(), QByteArray("\n\n"), QByteArray("<html></html>"),
                                      QByteArray("a=text:b\n"), QByteArray("[Desktop Entry]\nName=text:b\n"),
                                      "[HKEY_LOCAL_MACHINE\\SOFTWARE]\na=text:b\n" + QByteArray(4096, '\0')}) {
        files::writeBytes(file(), damaged);
        EXPECT_EQ(test::failureOf([] { check(); }), FileInputOutput) << damaged.left(20).toStdString();
        EXPECT_FALSE(createKey(Hive::LocalMachine, key));
        EXPECT_EQ(files::readBytes(file()), damaged);
    }
    files::remove(file());
    check();
    EXPECT_TRUE(createKey(Hive::LocalMachine, u"a"_s));
    EXPECT_TRUE(removeKey(Hive::LocalMachine, u"a"_s) && removeKey(Hive::LocalMachine, {}));
    check();
    EXPECT_TRUE(createKey(Hive::LocalMachine, u"a"_s)) << "the last key has gone, but not the file";
}

TEST_F(Registry, WhatCannotBeReadIsNotOverwritten)
{
    set(u"a"_s, u"1"_s);
    ::chmod(QFile::encodeName(file()).constData(), 0444);
    EXPECT_FALSE(set(u"a"_s, u"2"_s));
    EXPECT_EQ(text(u"a"_s), u"1"_s);

    profile::setRoot(profile.root() + u"/missing"_s);
    EXPECT_EQ(text(u"a"_s), u"(none)"_s);
    EXPECT_FALSE(createKey(Hive::LocalMachine, key));
    EXPECT_FALSE(QDir(profile::root()).exists());
}

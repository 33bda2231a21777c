// Files under the host's names: where they lie, what a failure leaves behind, which names are taken.
#include "platform/files/files.h"
#include "support/Failure.h"
#include "support/TestProfile.h"

#include <QDir>
#include <QElapsedTimer>
#include <QFile>

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <atomic>
#include <csignal>
#include <functional>
#include <thread>

using namespace Qt::StringLiterals;
using namespace kest;
using test::failureOf;

namespace {

class Files : public ::testing::Test {
protected:
    Files() { QDir().mkpath(profile.driveC() + u"/box"_s); }

    QString onDisk(const QString& name) const { return profile.driveC() + u"/box/"_s + name; }
    QStringList allNames() const { return QDir(profile.driveC() + u"/box"_s).entryList(QDir::Files | QDir::Hidden); }
    static void setMode(const QString& systemPath, mode_t mode)
    {
        ASSERT_EQ(::chmod(QFile::encodeName(systemPath).constData(), mode), 0);
    }

    test::TestProfile profile;
};

/// Lets no file of this process grow past a size, as a full disk does.
class FullDisk {
public:
    explicit FullDisk(rlim_t bytes) : handler(std::signal(SIGXFSZ, SIG_IGN))
    {
        ::getrlimit(RLIMIT_FSIZE, &before);
        const rlimit small{bytes, before.rlim_max};
        ::setrlimit(RLIMIT_FSIZE, &small);
    }
    ~FullDisk()
    {
        ::setrlimit(RLIMIT_FSIZE, &before);
        std::signal(SIGXFSZ, handler);
    }
    Q_DISABLE_COPY_MOVE(FullDisk)

private:
    rlimit before{};
    void (*handler)(int);
};

}  // namespace

TEST_F(Files, HostPathsLieInTheProfile)
{
    const std::pair<QString, QString> paths[] = {
        {u"c:\\wirdoc\\AUnread\\x.xml"_s, u"/drive_c/wirdoc/AUnread/x.xml"_s},
        {u"C:/wirdoc//x.xml"_s, u"/drive_c/wirdoc/x.xml"_s},
        {u"d:\\x"_s, u"/drive_d/x"_s},
        {u"\\\\s\\share\\x"_s, u"/unc/s/share/x"_s},
        {u"c:\\a\\..\\b\\.\\x"_s, u"/drive_c/b/x"_s},
        {u"c:\\..\\..\\etc\\passwd"_s, u"/drive_c/etc/passwd"_s},
        {u"\\\\..\\..\\x"_s, u"/unc/x"_s},
        {u"wirdoc\\x"_s, u"/drive_c/wirdoc/x"_s},
        {u"c:\\"_s, u"/drive_c"_s},
    };
    for (const auto& [path, expected] : paths)
        EXPECT_EQ(files::systemPath(path), profile.root() + expected) << path.toStdString();
    EXPECT_EQ(files::systemPath(onDisk(u"x"_s)), onDisk(u"x"_s));
    EXPECT_EQ(files::systemPath(onDisk(u"x"_s).replace(u'/', u'\\').replace(0, 1, u"/"_s)), onDisk(u"x"_s));
}

TEST_F(Files, NamesAreFoundWithoutRegardToCase)
{
    files::write(u"c:\\box\\One.xml"_s, u"1"_s);
    EXPECT_EQ(files::read(u"C:\\BOX\\ONE.XML"_s), u"1"_s);
    EXPECT_EQ(files::systemPath(u"c:\\Box\\new.xml"_s), onDisk(u"new.xml"_s)) << "a missing name keeps its spelling";

    for (const char* name : {"two.xml", "TWO.xml"}) {
        QFile file(onDisk(QString::fromLatin1(name)));
        ASSERT_TRUE(file.open(QFile::WriteOnly));
        file.write(name);
    }
    EXPECT_EQ(files::read(u"c:\\box\\two.xml"_s), u"two.xml"_s) << "the exact spelling first";
    EXPECT_EQ(files::read(u"c:\\box\\Two.XML"_s), u"TWO.xml"_s) << "then the first by name";

    files::write(u"c:\\box\\\u00c9t\u00e9.txt"_s, u"3"_s);
    EXPECT_EQ(files::read(u"c:\\box\\\u00e9T\u00c9.txt"_s), u"3"_s);
}

TEST_F(Files, AWriteReplacesAVariantInAnotherCase)
{
    files::write(u"c:\\box\\a.XML"_s, u"old"_s);
    files::write(u"c:\\box\\A.xml"_s, u"new"_s);
    EXPECT_EQ(allNames(), QStringList{u"A.xml"_s});
    EXPECT_EQ(files::read(u"c:\\box\\a.xml"_s), u"new"_s);

    files::write(u"c:\\box\\b.xml"_s, u"moved"_s);
    files::move(u"c:\\box\\B.xml"_s, u"c:\\box\\a.xml"_s);
    EXPECT_EQ(allNames(), QStringList{u"a.xml"_s});
    EXPECT_EQ(files::read(u"c:\\box\\a.xml"_s), u"moved"_s);
}

TEST_F(Files, FailuresHaveTheirUsualNumbers)
{
    files::write(u"c:\\box\\full.txt"_s, u"text"_s);
    files::write(u"c:\\box\\locked.txt"_s, u"text"_s);
    setMode(onDisk(u"locked.txt"_s), 0444);
    QDir().mkpath(onDisk(u"sub"_s));
    const QString full = u"c:\\box\\full.txt"_s;
    const QString locked = u"c:\\box\\locked.txt"_s;
    const QString missing = u"c:\\box\\missing.txt"_s;
    const QString nowhere = u"c:\\nowhere\\x.txt"_s;
    const std::pair<int, std::function<void()>> cases[] = {
        {FileNotFound, [&] { files::read(missing); }},
        {FileNotFound, [&] { files::remove(missing); }},
        {FileNotFound, [&] { files::copy(missing, full); }},
        {FileNotFound, [&] { files::move(missing, full); }},
        {PathNotFound, [&] { files::write(nowhere, u"x"_s); }},
        {PathNotFound, [&] { files::copy(full, nowhere); }},
        {PathNotFound, [&] { files::write(u"c:\\box\\full.txt\\x"_s, u"x"_s); }},
        {PathNotFound, [&] { files::write(u"c:\\box\\a"_s + QChar(0) + u"b"_s, u"x"_s); }},
        {PermissionDenied, [&] { files::write(locked, u"x"_s); }},
        {PermissionDenied, [&] { files::append(locked, u"x"_s); }},
        {PermissionDenied, [&] { files::copy(full, locked); }},
        {PermissionDenied, [&] { files::move(full, locked); }},
        {PermissionDenied, [&] { files::remove(locked); }},
        {PermissionDenied, [&] { files::remove(u"c:\\box\\sub"_s); }},
        {FileExists, [&] { files::makeFolder(full); }}};
    for (size_t i = 0; i < std::size(cases); ++i)
        EXPECT_EQ(failureOf(cases[i].second), cases[i].first) << "case " << i;
    EXPECT_EQ(files::read(full), u"text"_s);
    EXPECT_EQ(files::read(locked), u"text"_s);

    setMode(onDisk({}), 0555);
    EXPECT_EQ(failureOf([&] { files::write(missing, u"x"_s); }), PermissionDenied);
    EXPECT_EQ(failureOf([&] { files::remove(full); }), PermissionDenied);
    setMode(onDisk({}), 0755);

    files::remove(locked, files::Force::Yes);
    EXPECT_FALSE(files::exists(locked));
    EXPECT_FALSE(files::exists(u"c:\\box\\sub"_s)) << "a folder is no file";
    EXPECT_TRUE(files::folderExists(u"c:\\BOX\\sub\\"_s));
}

TEST_F(Files, AFullDiskLeavesTheOldFileAndNoHalfOne)
{
    files::write(u"c:\\box\\a.xml"_s, u"old"_s);
    files::write(u"c:\\box\\big.jpg"_s, QString(5000, u'x'));
    {
        const FullDisk full(1000);
        EXPECT_EQ(failureOf([&] { files::write(u"c:\\box\\a.xml"_s, QString(5000, u'y')); }), FileInputOutput);
        EXPECT_EQ(failureOf([&] { files::append(u"c:\\box\\a.xml"_s, QString(5000, u'y')); }), FileInputOutput);
        EXPECT_EQ(failureOf([&] { files::copy(u"c:\\box\\big.jpg"_s, u"c:\\box\\copy.jpg"_s); }), FileInputOutput);
    }
    EXPECT_EQ(files::read(u"c:\\box\\a.xml"_s), u"old"_s);
    EXPECT_EQ(allNames(), (QStringList{u"a.xml"_s, u"big.jpg"_s}));
}

TEST_F(Files, AReaderSeesWholeFilesOnly)
{
    const QString path = u"c:\\box\\a.xml"_s;
    const QString texts[] = {QString(200000, u'a'), QString(300000, u'b')};
    files::write(path, texts[0]);
    std::atomic<bool> done = false;
    std::thread writer([&] {
        for (int i = 0; i < 30; ++i)
            files::write(path, texts[i % 2]);
        done = true;
    });
    int broken = 0;
    while (!done) {
        const QString seen = files::read(path);
        broken += seen == texts[0] || seen == texts[1] ? 0 : 1;
        broken += files::list(u"c:\\box\\"_s).size() == 1 ? 0 : 1;
    }
    writer.join();
    EXPECT_EQ(broken, 0);
}

TEST_F(Files, TheCodePageKeepsEveryByte)
{
    QByteArray all;
    for (int i = 0; i < 256; ++i)
        all.append(static_cast<char>(i));
    EXPECT_EQ(files::toCodePage(files::fromCodePage(all)), all);
    EXPECT_EQ(files::fromCodePage("\x80\x92\x81\xE9"), u"\u20ac\u2019\u0081\u00e9"_s);
    EXPECT_EQ(files::toCodePage(u"a\u20ac\u0394\U0001F697z"_s), "a\x80??z") << "one question mark for one character";

    files::writeBytes(u"c:\\box\\all.txt"_s, all);
    EXPECT_EQ(files::toCodePage(files::read(u"c:\\box\\all.txt"_s)), all);
}

TEST_F(Files, ANameFromOutsideStaysInItsFolder)
{
    for (const QString& name : {u"500.0_1.xml"_s, u".hidden"_s, u"a b (1).jpg"_s, u"\u00e9.xml"_s}) {
        EXPECT_TRUE(files::isPlainName(name)) << name.toStdString();
        EXPECT_EQ(files::pathForWriting(u"c:\\box\\"_s, name), u"c:\\box\\"_s + name);
    }
    for (const QString& name : {u""_s, u"."_s, u".."_s, u"..\\x"_s, u"../x"_s, u"a/b"_s, u"a\\b"_s, u"c:x"_s, u"a..b"_s,
                                u"x\n.xml"_s, u"x\t"_s, u"x\u0081"_s, u"x"_s + QChar(0) + u".xml"_s, u"\u007f"_s}) {
        EXPECT_FALSE(files::isPlainName(name)) << name.toStdString();
        EXPECT_EQ(failureOf([&] { files::pathForWriting(u"c:\\box\\"_s, name); }), PathNotFound) << name.toStdString();
    }
}

TEST_F(Files, AListIsOrderedByTheUpperCasedName)
{
    for (const char* name : {"b.xml", "A_2.xml", "a.XML", "a1.xml", "Z.jpg", ".kest-1.tmp"}) {
        QFile file(onDisk(QString::fromLatin1(name)));
        ASSERT_TRUE(file.open(QFile::WriteOnly));
    }
    QDir().mkpath(onDisk(u"folder.xml"_s));
    EXPECT_EQ(files::list(u"c:\\box"_s), (QStringList{u"a.XML"_s, u"a1.xml"_s, u"A_2.xml"_s, u"b.xml"_s, u"Z.jpg"_s}));
    EXPECT_EQ(files::list(u"C:\\Box\\"_s, u"a*.xml"_s), (QStringList{u"a.XML"_s, u"a1.xml"_s, u"A_2.xml"_s}));
    EXPECT_EQ(files::list(u"c:\\nowhere"_s), QStringList());
}

TEST_F(Files, PatternsKnowTwoSignsOnly)
{
    const std::pair<bool, QStringList> cases[] = {
        {true,
         {u"abc.jpg *.JPG"_s, u"abc.jpg a?c*"_s, u" *"_s, u"a[1].jpg a[1]*.jpg"_s, u"aXbXc *x*c"_s, u"ab a**b"_s}},
        {false, {u"abc a?"_s, u"a "_s, u"a1.jpg a[1]*.jpg"_s, u"a.xml a*b"_s}}};
    for (const auto& [expected, texts] : cases)
        for (const QString& text : texts)
            EXPECT_EQ(files::matches(text.section(u' ', 0, 0), text.section(u' ', 1)), expected) << text.toStdString();

    QElapsedTimer time;
    time.start();
    EXPECT_FALSE(files::matches(QString(5000, u'a'), u"*a"_s.repeated(500) + u"b"_s));
    EXPECT_LT(time.elapsed(), 2000);
}

TEST_F(Files, Base64IsDecodedStrictly)
{
    EXPECT_EQ(files::fromBase64(u"aGVs\r\n bG8=\t"_s), "hello");
    EXPECT_EQ(files::fromBase64(u""_s), "");
    EXPECT_EQ(files::fromBase64(u"+/+/"_s), "\xfb\xff\xbf");
    for (const char* text : {"aGVsbG8", "aGVs*G8=", "a===", "=aGV", "aG=s", "-_-_", "aGVsbG8=aGVs"})
        EXPECT_EQ(failureOf([&] { files::fromBase64(QString::fromLatin1(text)); }), TypeMismatch) << text;
    EXPECT_EQ(failureOf([] { files::fromBase64(u"aGV\u0173"_s); }), TypeMismatch);
}

TEST_F(Files, AFileThatIsHeldGoesInTheBackground)
{
    files::write(u"c:\\box\\held.xml"_s, u"x"_s);
    setMode(onDisk(u"held.xml"_s), 0444);
    files::removeInBackground(u"c:\\box\\HELD.xml"_s);
    EXPECT_TRUE(files::waitForBackground(5000)) << "a read-only file goes too";
    EXPECT_FALSE(files::exists(u"c:\\box\\held.xml"_s));

    files::write(u"c:\\box\\held.xml"_s, u"x"_s);
    setMode(onDisk({}), 0555);
    files::removeInBackground(u"c:\\box\\held.xml"_s);
    EXPECT_FALSE(files::waitForBackground(250));
    EXPECT_TRUE(files::exists(u"c:\\box\\held.xml"_s));
    setMode(onDisk({}), 0755);
    EXPECT_TRUE(files::waitForBackground(5000));
    EXPECT_FALSE(files::exists(u"c:\\box\\held.xml"_s));
    files::removeInBackground(u"c:\\box\\never.xml"_s);
    EXPECT_TRUE(files::waitForBackground(0));
}

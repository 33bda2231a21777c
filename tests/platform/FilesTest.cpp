// Tests files with the host's names: where they are, what remains after an error, and which names are valid.
#include "platform/files/Background.h"
#include "platform/files/Base64.h"
#include "platform/files/CodePage.h"
#include "platform/files/Lock.h"
#include "support/FullDisk.h"
#include "support/Test.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <future>
#include <numeric>

const QString box = u"c:\\box\\"_s;

struct Files : ::testing::Test {
    Files() { QDir().mkpath(onDisk({})); }

    QString onDisk(const QString& name) const { return profile.driveC() + u"/box/"_s + name; }
    QStringList allNames() const { return QDir(onDisk({})).entryList(QDir::Files | QDir::Hidden); }
    /// Creates empty files, as another program would.
    void touch(std::initializer_list<const char*> names) const
    {
        for (const char* name : names)
            ASSERT_TRUE(QFile(onDisk(QString::fromLatin1(name))).open(QFile::WriteOnly));
    }
    void setTime(const QString& name, const QDateTime& time) const
    {
        QFile file(onDisk(name));
        ASSERT_TRUE(file.open(QIODevice::Append) && file.setFileTime(time, QFileDevice::FileModificationTime));
    }
    void setMode(const QString& name, mode_t mode) const
    {
        ASSERT_EQ(::chmod(QFile::encodeName(onDisk(name)).constData(), mode), 0);
    }

    test::TestProfile profile;
};

TEST_F(Files, NamesAreTakenAsTheTableSays)
{
    const auto writtenFromBase64 = [&](const QString& text) {
        files::writeBase64(box + u"decoded"_s, text.toUtf8());
        return QString::fromLatin1(files::readBytes(box + u"decoded"_s));
    };
    const auto answer = [&](const QString& question, const QString& text) {
        if (question == u"path"_s)
            return files::systemPath(text).remove(profile.root());
        if (question == u"for writing"_s)
            return files::pathForWriting(box, text).remove(box);
        if (question == u"base64"_s)
            return writtenFromBase64(text);
        return toText(files::matches(text, question.mid(5)));
    };
    for (const QStringList& row : test::rowsIn("files.txt"))
        for (const QString& text : row.mid(2))
            EXPECT_EQ(test::outcomeOf([&] { return answer(row[0], text); }), row[1]) << row[0] << ": " << text;
    EXPECT_EQ(files::systemPath(onDisk(u"x"_s)), onDisk(u"x"_s));
    EXPECT_FALSE(files::isPlainName(u"..\\x"_s));

    const QDeadlineTimer limit(2000);
    EXPECT_FALSE(files::matches(QString(5000, u'a'), u"*a"_s.repeated(500) + u"b"_s));
    EXPECT_FALSE(limit.hasExpired());
}

TEST_F(Files, NamesAreFoundWithoutRegardToCase)
{
    touch({"a.XML"});
    files::write(box + u"A.xml"_s, u"new"_s);
    EXPECT_EQ(allNames(), QStringList{u"A.xml"_s}) << "a write replaces a variant in another case";
    EXPECT_EQ(files::read(u"C:\\BOX\\a.xml"_s), u"new"_s);
    files::write(box + u"b.xml"_s, u"moved"_s);
    files::move(box + u"B.xml"_s, box + u"a.xml"_s);
    EXPECT_EQ(allNames(), QStringList{u"a.xml"_s});
    EXPECT_EQ(files::read(box + u"A.xml"_s), u"moved"_s);

    touch({"two.xml", "TWO.xml"});
    EXPECT_EQ(files::systemPath(box + u"two.xml"_s), onDisk(u"two.xml"_s)) << "the exact spelling first";
    EXPECT_EQ(files::systemPath(box + u"Two.XML"_s), onDisk(u"TWO.xml"_s)) << "then the first by name";
    EXPECT_EQ(files::systemPath(u"c:\\Box\\new.XML"_s), onDisk(u"new.XML"_s)) << "a missing name keeps its spelling";
    files::write(box + u"\u00c9t\u00e9.txt"_s, u"3"_s);
    EXPECT_EQ(files::read(box + u"\u00e9T\u00c9.txt"_s), u"3"_s);
}

TEST_F(Files, FailuresHaveTheirUsualNumbers)
{
    for (const char* file : {"full.txt", "locked.txt"})
        files::write(box + QLatin1StringView(file), u"text"_s);
    setMode(u"locked.txt"_s, 0444);
    QDir().mkpath(onDisk(u"sub"_s));
    const std::map<QString, void (*)(const QString&, const QString&)> steps{
        {u"read"_s, [](const QString& path, const QString&) { files::read(path); }},
        {u"write"_s, [](const QString& path, const QString&) { files::write(path, u"x"_s); }},
        {u"append"_s, [](const QString& path, const QString&) { files::append(path, u"x"_s); }},
        {u"remove"_s, [](const QString& path, const QString&) { files::remove(path); }},
        {u"make folder"_s, [](const QString& path, const QString&) { files::makeFolder(path); }},
        {u"copy"_s, [](const QString& path, const QString& to) { files::copy(path, to); }},
        {u"move"_s, [](const QString& path, const QString& to) { files::move(path, to); }}};
    for (const QStringList& row : rowsIn("file-failures.txt"))
        EXPECT_EQ(failureOf([&] { steps.at(row[0])(box + row[2], box + row.value(3)); }), row[1].toInt()) << row[2];
    EXPECT_EQ(files::read(box + u"full.txt"_s) + files::read(box + u"locked.txt"_s), u"texttext"_s);

    files::remove(box + u"locked.txt"_s, files::Force::Yes);
    EXPECT_FALSE(files::exists(box + u"locked.txt"_s));
    EXPECT_FALSE(files::exists(box + u"sub"_s)) << "a folder is no file";
    EXPECT_TRUE(files::folderExists(u"c:\\BOX\\sub\\"_s));
}

TEST_F(Files, AFullDiskLeavesTheOldFile)
{
    files::write(box + u"a.xml"_s, u"old"_s);
    files::write(box + u"big.jpg"_s, QString(5000, u'x'));
    {
        const auto full = test::fullDisk(1000);
        EXPECT_EQ(failureOf([&] { files::write(box + u"a.xml"_s, QString(5000, u'y')); }), DiskFull);
        EXPECT_EQ(failureOf([&] { files::append(box + u"a.xml"_s, QString(5000, u'y')); }), DiskFull);
        EXPECT_EQ(failureOf([&] { files::copy(box + u"big.jpg"_s, box + u"copy.jpg"_s); }), DiskFull);
    }
    EXPECT_EQ(files::read(box + u"a.xml"_s), u"old"_s);
    EXPECT_EQ(allNames(), (QStringList{u"a.xml"_s, u"big.jpg"_s}));
}

TEST_F(Files, AReaderSeesWholeFilesOnly)
{
    const QString texts[] = {QString(200000, u'a'), QString(300000, u'b')};
    files::write(box + u"a.xml"_s, texts[0]);
    const auto writer = std::async(std::launch::async, [&] {
        for (int i = 0; i < 30; ++i)
            files::write(box + u"a.xml"_s, texts[i % 2]);
    });
    while (writer.wait_for(std::chrono::seconds(0)) != std::future_status::ready) {
        const QString seen = files::read(box + u"a.xml"_s);
        EXPECT_TRUE((seen == texts[0] || seen == texts[1]) && files::list(box).size() == 1) << seen.size();
    }
}

TEST_F(Files, TheCodePageKeepsEveryByte)
{
    QByteArray all(256, '\0');
    std::iota(all.begin(), all.end(), '\0');
    files::writeBytes(box + u"all.txt"_s, all);
    EXPECT_EQ(files::toCodePage(files::read(box + u"all.txt"_s)), all);
    EXPECT_EQ(files::fromCodePage("\x80\x92\x81\xE9"), u"\u20ac\u2019\u0081\u00e9"_s);
    EXPECT_EQ(files::toCodePage(u"a\u20ac\u0394\U0001F697z"_s), "a\x80??z") << "one question mark for one character";
}

TEST_F(Files, AListIsOrderedByTheUpperCasedName)
{
    touch({"b.xml", "A_2.xml", "a.XML", "a1.xml", "Z.jpg", ".kest-1.tmp"});
    QDir().mkpath(onDisk(u"folder.xml"_s));
    EXPECT_EQ(files::list(u"c:\\box"_s).join(u' '), u"a.XML a1.xml A_2.xml b.xml Z.jpg"_s);
    EXPECT_EQ(files::list(u"C:\\Box\\"_s, u"a*.xml"_s).join(u' '), u"a.XML a1.xml A_2.xml"_s);
    EXPECT_EQ(files::list(u"c:\\nowhere"_s), QStringList());
}

TEST_F(Files, AFileThatIsHeldGoesInTheBackgroundOrByTheNextProcess)
{
    const QString path = files::systemPath(box + u"held.xml"_s);
    const QString list = profile::root() + u"/removals.json"_s;
    const QDateTime written(QDate(2024, 5, 6), QTime(7, 8));
    touch({"held.xml"});
    setTime(u"held.xml"_s, written);
    setMode(u"held.xml"_s, 0444);
    setMode({}, 0555);
    EXPECT_EQ(failureOf([&] { files::write(box + u"new.xml"_s, u"x"_s); }), PermissionDenied);
    files::removeInBackground(box + u"HELD.xml"_s);
    EXPECT_FALSE(files::waitForBackground(250));
    EXPECT_TRUE(files::exists(path));
    const QByteArray left = files::readBytes(list);
    setMode({}, 0755);
    EXPECT_TRUE(files::waitForBackground(5000)) << "a read-only file goes too";
    EXPECT_FALSE(files::exists(path) || files::exists(list));
    files::removeInBackground(box + u"never.xml"_s);
    EXPECT_TRUE(files::waitForBackground(0));

    for (const int secondsLater : {0, 1}) {  // another file of that name stays
        touch({"held.xml"});
        setTime(u"held.xml"_s, written.addSecs(secondsLater));
        files::writeBytes(list, left);
        files::resumeRemovals();
        EXPECT_EQ(files::exists(path), secondsLater == 1);
    }
}

TEST_F(Files, ANameThatIsNoUtf8IsOneLikeAnyOther)
{
    const QString emoji = u"\U0001F480.xml"_s;  // half of the character looks like the code for a byte
    files::write(box + emoji, u"1"_s);
    for (const char* name : {"caf\xe9.xml", "\xff\xfe", "Gr\xc3\xbc\xdf.xml"}) {
        const int made = ::creat((onDisk({}).toUtf8() + name).constData(), 0644);
        ASSERT_GE(made, 0);
        ::close(made);
        files::remove(box + emoji);
        const QStringList names = files::list(box);
        ASSERT_EQ(names.size(), 1) << name;
        EXPECT_EQ(files::read(box + QString(names[0]).replace(u"xml"_s, u"XML"_s)), QString());
        EXPECT_TRUE(files::isPlainName(names[0]));
        files::move(box + names[0], box + emoji);
        EXPECT_EQ(files::list(box), QStringList{emoji});
    }
}

TEST_F(Files, LeftOversOfKilledWritersGoAfterADay)
{
    touch({".kest-old.tmp", ".kest-new.tmp", "old.xml", ".kest-old.xml"});
    for (const QString& old : {u".kest-old.tmp"_s, u"old.xml"_s, u".kest-old.xml"_s})
        setTime(old, QDateTime::currentDateTime().addDays(-2));
    files::removeLeftOvers(box);
    EXPECT_EQ(allNames().join(u' '), u".kest-new.tmp .kest-old.xml old.xml"_s);
    files::removeLeftOvers(u"c:\\nowhere"_s);
}

TEST_F(Files, ALockGoesWithItsProcessWhateverItsFileHolds)
{
    const QString path = box + u"x.lock"_s;
    const auto isFree = [&](const QString& name, int wait = 0) { return files::Lock(path, name, wait).isHeld(); };
    for (const QString& leftOver : {u""_s, u"1\nkest2\nanother-machine\n"_s}) {
        files::write(path, leftOver);
        EXPECT_TRUE(isFree(u"load m.xml"_s)) << leftOver;
    }
    int ready[2];
    ASSERT_EQ(::pipe(ready), 0);
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        const files::Lock held(path, u"load m.xml"_s);
        ::_exit(::write(ready[1], "x", 1) == 1 && ::pause());
    }
    char any = 0;
    ASSERT_EQ(::read(ready[0], &any, 1), 1);
    EXPECT_FALSE(isFree(u"load m.xml"_s, 20));
    EXPECT_TRUE(isFree(u"load n.xml"_s));
    ::kill(child, SIGKILL);
    EXPECT_TRUE(isFree(u"load m.xml"_s, 10000));
    ::waitpid(child, nullptr, 0);
    for (const int end : ready)
        ::close(end);
    const files::Lock held(path);
    EXPECT_FALSE(isFree({})) << "in one process too";
}

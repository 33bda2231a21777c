// Reads each hostile file of the corpus within limits of time and memory. Nothing may be changed that the file does not
// concern. index.txt says what each file attacks.
#include "corpus/Targets.h"
#include "support/Cost.h"
#include "support/ShopDatabase.h"
#include "support/Test.h"

#include <sys/resource.h>

namespace {

struct Limits {
    double milliseconds;
    double megabytes;
};
constexpr Limits ofMessages{200 * slowness, 100};  // what is promised for each load and fill
constexpr Limits ofOthers{2000 * slowness, 200};
constexpr rlim_t mostData = rlim_t(2048) << 20;  // bytes; ends a flood before it fills the machine

struct Hostile {
    std::string name;
    QByteArray content;
};

/// Returns the files for a target: those in its folder, and those that the index describes by a repeated piece.
std::vector<Hostile> corpusOf(const QString& target)
{
    const QDir folder(checkoutFile(u"tests/corpus/"_s + target));
    QStringList named;
    std::vector<Hostile> files;
    for (const QStringList& row : rowsIn("../corpus/index.txt")) {
        if (row[0].section(u'/', 0, 0) != target)
            continue;
        const std::string name = row[0].toStdString();
        EXPECT_TRUE((row.size() == 2 || row.size() == 6) && row[1].size() > 10) << name;
        if (row.size() == 2) {
            named += row[0].section(u'/', 1);
            files.push_back({name, files::readBytes(folder.filePath(named.last()))});
        } else {
            files.push_back({name, (row[2] + row[3].repeated(row[4].toInt()) + row[5]).toLatin1()});
        }
    }
    QStringList found = folder.entryList(QDir::Files);
    named.sort();
    found.sort();
    EXPECT_EQ(named, found) << "the index says of each file what it attacks";
    return files;
}

}  // namespace

class Corpus : public ::testing::TestWithParam<const char*> {};

TEST_P(Corpus, DoesNoHarm)
{
    if (memoryIsReal) {
        rlimit limit{};
        ASSERT_EQ(::getrlimit(RLIMIT_DATA, &limit), 0);
        limit.rlim_cur = mostData;
        ASSERT_EQ(::setrlimit(RLIMIT_DATA, &limit), 0);
    }
    const std::unique_ptr<Target> target = makeTarget(GetParam());
    const QString name = QString::fromLatin1(GetParam());
    const Limits& most = (name == u"load"_s || name == u"fill"_s) ? ofMessages : ofOthers;
    const std::vector<Hostile> files = corpusOf(name);
    EXPECT_GT(files.size(), 4U);
    const std::string held = holdings();
    for (const Hostile& file : files) {
        const std::string& read = file.name;
        std::cout << read << std::endl;  // names the file that hangs
        const Cost cost = costOf([&] { EXPECT_NO_THROW(target->take(file.content)) << read; });
        EXPECT_LT(cost.milliseconds, most.milliseconds) << read;
        EXPECT_TRUE(cost.megabytes < most.megabytes || !memoryIsReal) << read << ": " << cost.megabytes;
        EXPECT_EQ(difference(held, holdings()), "\n") << read;
    }
}

INSTANTIATE_TEST_SUITE_P(Of, Corpus, ::testing::ValuesIn(targetNames));

// The command kest2-day plays the working day on a new demo shop, to its end or until the given step has been played.
// With --has-display it only says by its exit code if windows can be shown.
#include "day/Day.h"
#include "day/DayPage.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Display.h"
#include "platform/desktop/ScratchSettings.h"
#include "platform/files/Background.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QApplication>
#include <QDir>

#include <cstdio>

namespace {

constexpr int backgroundWait = 30'000;  // milliseconds

int play(const QStringList& words)
{
    using namespace kest;
    profile::setRoot(words[1]);
    app::Day day(words[2]);
    app::DayPage page(QDir(words[2]).absolutePath());
    for (const QString& step : app::Day::steps()) {
        std::puts(qUtf8Printable(step));
        std::fflush(stdout);
        page.add(step, day.play(step));
        if (step.section(u'.', 0, 0) == words.value(3))
            break;
    }
    files::waitForBackground(backgroundWait);
    return 0;
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc == 2 && QLatin1StringView(argv[1]) == QLatin1StringView("--has-display"))
        return kest::desktop::hasDisplay() ? 0 : 1;
    if (!qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    const kest::desktop::ScratchSettings scratch;
    QApplication application(argc, argv);
    const QStringList words = QCoreApplication::arguments();
    if (words.size() < 3) {
        std::fputs("kest2-day PROFILE PICTURES [LAST STEP]\n", stderr);
        return 2;
    }
    try {
        return play(words);
    } catch (const kest::desktop::NeedsAnswer& needed) {
        std::fprintf(stderr, "kest2-day: %s\n", qUtf8Printable(needed.reason()));
    } catch (const kest::RuntimeError& error) {
        std::fprintf(stderr, "kest2-day: %s\n", qUtf8Printable(error.description()));
    }
    return 1;
}

// Measures the time from process start to the visible panel against a program that shows one line of text.
#include "platform/profile.h"
#include "setup/Profile.h"
#include "shell/component.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QFile>
#include <QProcess>
#include <QTemporaryDir>

#include <benchmark/benchmark.h>

#include <algorithm>
#include <vector>

namespace {

const QTemporaryDir& folder()
{
    static const QTemporaryDir made;
    return made;
}

/// Returns the milliseconds that a program needs to start, show its window, close it and end.
double runOnce(const QString& program, const QStringList& arguments)
{
    QElapsedTimer clock;
    clock.start();
    QProcess process;
    process.start(program, arguments);
    if (!process.waitForFinished() || process.exitCode() != 0)
        qFatal("%s failed: %s", qPrintable(program), process.readAllStandardError().constData());
    return clock.nsecsElapsed() / 1e6;
}

double emptyWindow()
{
    return runOnce(QStringLiteral(KEST_EMPTY_WINDOW), {});
}

double panel()
{
    return runOnce(QStringLiteral(KEST_COMMAND),
                   {QStringLiteral("--profile"), folder().path() + QStringLiteral("/shop"), QStringLiteral("--script"),
                    folder().path() + QStringLiteral("/close.json"), QStringLiteral("open"), QStringLiteral("500")});
}

double median(std::vector<double> values)
{
    std::nth_element(values.begin(), values.begin() + values.size() / 2, values.end());
    return values[values.size() / 2];
}

void startToShownPanel(benchmark::State& state)
{
    std::vector<double> floor;
    std::vector<double> panels;
    for (auto _ : state) {
        panels.push_back(panel());
        state.PauseTiming();
        floor.push_back(emptyWindow());
        state.ResumeTiming();
    }
    state.counters["floor_ms"] = median(floor);
    state.counters["panel_ms"] = median(panels);
    state.counters["ratio"] = median(panels) / median(floor);
}
BENCHMARK(startToShownPanel)->Iterations(25)->UseRealTime()->Unit(benchmark::kMillisecond);

}  // namespace

int main(int argc, char** argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication application(argc, argv);
    kest::profile::setRoot(folder().path() + QStringLiteral("/shop"));
    kest::app::initProfile(kest::registerClass, kest::app::Shop::New);
    QFile script(folder().path() + QStringLiteral("/close.json"));
    if (!script.open(QIODevice::WriteOnly) || script.write(R"({"windows": {"frmKEST": [[{"click": "cmdExit"}]]}})") < 0)
        return 1;
    script.close();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}

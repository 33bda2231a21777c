// Compares an operation with its floor.
#pragma once

#include <QElapsedTimer>

#include <benchmark/benchmark.h>

#include <algorithm>
#include <vector>

namespace kest {

/// Measures an operation and its floor in turn, so that other work of the machine slows both down. Reports the time of
/// the operation, and the ratio of the medians, which a pause of the disk does not change.
class InTurn {
public:
    explicit InTurn(benchmark::State& measured) : state(measured) {}
    ~InTurn() { state.counters["ratio_to_floor"] = median(operations) / median(floors); }
    Q_DISABLE_COPY_MOVE(InTurn)

    template <class Step>
    void floor(const Step& step)
    {
        floors.push_back(secondsOf(step));
    }
    template <class Step>
    void operation(const Step& step)
    {
        operations.push_back(secondsOf(step));
        state.SetIterationTime(operations.back());
    }

private:
    template <class Step>
    static double secondsOf(const Step& step)
    {
        QElapsedTimer timer;
        timer.start();
        step();
        return double(timer.nsecsElapsed()) / 1e9;
    }

    static double median(std::vector<double>& values)
    {
        const auto middle = values.begin() + std::ptrdiff_t(values.size() / 2);
        std::nth_element(values.begin(), middle, values.end());
        return *middle;
    }

    benchmark::State& state;
    std::vector<double> floors;
    std::vector<double> operations;
};

}  // namespace kest

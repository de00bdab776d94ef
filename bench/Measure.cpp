#include "Measure.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <limits>

namespace
{

constexpr int Runs = 9;

double TimeOnce(const std::function<void()>& work, const std::function<void()>& prepare)
{
    using Clock = std::chrono::steady_clock;
    prepare();
    const Clock::time_point start = Clock::now();
    work();
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

} // namespace

Measure Compare(std::string name, double atMost, const std::function<void()>& ours, const std::function<void()>& floor,
                const std::function<void()>& prepare)
{
    double best = std::numeric_limits<double>::max();
    double bestFloor = best;
    for (int run = 0; run < Runs; ++run)
    {
        bestFloor = std::min(bestFloor, TimeOnce(floor, prepare));
        best = std::min(best, TimeOnce(ours, prepare));
    }
    return {std::move(name), best, bestFloor, atMost};
}

double BestTime(const std::function<void()>& work, const std::function<void()>& prepare)
{
    double best = std::numeric_limits<double>::max();
    for (int run = 0; run < Runs; ++run)
    {
        best = std::min(best, TimeOnce(work, prepare));
    }
    return best;
}

MeasureTable::MeasureTable()
{
    std::printf("%-66s %12s %12s %7s %8s\n", "measure", "ours [ms]", "floor [ms]", "ratio", "at most");
}

void MeasureTable::Print(const Measure& measure)
{
    const double ratio = measure.ours / measure.floor;
    std::printf("%-66s %12.4f %12.4f %7.2f %8.1f%s\n", measure.name.c_str(), measure.ours, measure.floor, ratio,
                measure.atMost, ratio > measure.atMost ? "  missed" : "");
    std::fflush(stdout);
}

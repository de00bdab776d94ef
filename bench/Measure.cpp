#include "Measure.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <limits>

namespace
{

// A short measure runs more often: its best time is then the same in each run of the program.
constexpr int FewestRuns = 9;
constexpr int MostRuns = 200;
constexpr double EnoughTime = 300; // milliseconds

/// Calls `once`, which gives a time in milliseconds, as often as worthwhile.
template <typename Once>
void Repeat(const Once& once)
{
    double total = 0;
    for (int run = 0; run < FewestRuns || (run < MostRuns && total < EnoughTime); ++run)
    {
        total += once();
    }
}

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
    Repeat([&] {
        const double floorTime = TimeOnce(floor, prepare);
        const double time = TimeOnce(ours, prepare);
        bestFloor = std::min(bestFloor, floorTime);
        best = std::min(best, time);
        return floorTime + time;
    });
    return {std::move(name), best, bestFloor, atMost};
}

double BestTime(const std::function<void()>& work, const std::function<void()>& prepare)
{
    double best = std::numeric_limits<double>::max();
    Repeat([&] {
        const double time = TimeOnce(work, prepare);
        best = std::min(best, time);
        return time;
    });
    return best;
}

MeasureTable::MeasureTable()
{
    std::printf("%-78s %12s %12s %7s %8s\n", "measure", "ours [ms]", "floor [ms]", "ratio", "at most");
}

void MeasureTable::Print(const Measure& measure)
{
    const double ratio = measure.ours / measure.floor;
    std::printf("%-78s %12.4f %12.4f %7.2f %8.1f%s\n", measure.name.c_str(), measure.ours, measure.floor, ratio,
                measure.atMost, ratio > measure.atMost ? "  missed" : "");
    std::fflush(stdout);
}

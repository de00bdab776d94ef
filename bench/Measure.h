#pragma once

#include <functional>
#include <string>

/// One row of the table: what the library takes and the least that any implementation must do, in
/// milliseconds (the best of several runs, taken in turns), and the greatest ratio wanted.
struct Measure
{
    std::string name;
    double ours;
    double floor;
    double atMost;
};

/// Times both in turns, so that both see the same state of the machine. `prepare` runs before each and is not
/// timed.
Measure Compare(
    std::string name, double atMost, const std::function<void()>& ours, const std::function<void()>& floor,
    const std::function<void()>& prepare = [] {});

/// Best time of one run in milliseconds.
double BestTime(
    const std::function<void()>& work, const std::function<void()>& prepare = [] {});

/// Keeps a value that nothing else uses: the work that made it is not optimised away.
template <typename Value>
void Keep(const Value& value)
{
    const volatile Value kept = value;
    static_cast<void>(kept);
}

/// Prints the table.
class MeasureTable
{
public:
    MeasureTable();
    void Print(const Measure& measure);
};

void BenchDialogs(MeasureTable& table);
void BenchFilters(MeasureTable& table);
void BenchGit(MeasureTable& table);
void BenchInitialize(MeasureTable& table);
void BenchIsolation(MeasureTable& table);
void BenchLists(MeasureTable& table);
void BenchMsscci(MeasureTable& table);
void BenchNotifications(MeasureTable& table);
void BenchOperations(MeasureTable& table);
void BenchPrompts(MeasureTable& table);

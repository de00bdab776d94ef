#include "Measure.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

namespace
{

struct Group
{
    std::string_view name;
    void (*run)(MeasureTable&);
};

constexpr Group Groups[] = {
    {"msscci", BenchMsscci},   {"isolation", BenchIsolation},         {"initialize", BenchInitialize},
    {"lists", BenchLists},     {"operations", BenchOperations},       {"prompts", BenchPrompts},
    {"filters", BenchFilters}, {"notifications", BenchNotifications}, {"dialogs", BenchDialogs},
    {"git", BenchGit},
};

} // namespace

/// Prints the table of measures; a row above its figure is marked "missed". The arguments name groups of measures;
/// without any, all are run.
int main(int count, char** arguments)
{
    for (int i = 1; i < count; ++i)
    {
        const auto isNamed = [&](const Group& group) { return group.name == arguments[i]; };
        if (std::none_of(std::begin(Groups), std::end(Groups), isNamed))
        {
            std::printf("no group of measures is called %s\n", arguments[i]);
            return 1;
        }
    }
    MeasureTable table;
    for (const Group& group : Groups)
    {
        if (count == 1 || std::find(arguments + 1, arguments + count, group.name) != arguments + count)
        {
            group.run(table);
        }
    }
    return 0;
}

#include "Measure.h"

/// Prints the table of measures; a row above its figure is marked "missed".
int main()
{
    MeasureTable table;
    BenchMsscci(table);
    BenchLists(table);
    BenchFiles(table);
    BenchNotifications(table);
    BenchDialogs(table);
    return 0;
}

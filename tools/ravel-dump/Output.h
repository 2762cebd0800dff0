// What is printed once the whole capture has been read.
#ifndef RAVEL_DUMP_OUTPUT_H
#define RAVEL_DUMP_OUTPUT_H

#include <cstdio>

#include "Carousel.h"
#include "Report.h"
#include "Stats.h"
#include "Summary.h"
#include "TableKind.h"
#include "TableRegistry.h"
#include "TraceOutput.h"

namespace ravel_dump {

// Default output: for each distinct table, in the order first seen, a line
// saying what it is and how often it was seen, then the table's own Show().
// The sections of a table are joined with its operator+= first.
void DumpTables(const TableRegistry& registry, const TableFilter& filter, TraceOutput& trace, std::FILE* out);
// One table so: as it completes, new or changed, or at the end, with its count.
enum class TableMoment { kNew, kChanged, kAtEnd };
void DumpTable(const TableEntry& table, TableMoment moment, TraceOutput& trace, std::FILE* out);

// The summary of the tables read (the latest version of each) and of the
// carousel modules.
Summary BuildSummary(const TableRegistry& registry, const CarouselCollector& carousel, TraceOutput& trace);

// Every distinct descriptor of the DSM-CC stream descriptor sections read.
std::vector<StreamDescriptorSummary> BuildStreamDescriptors(const TableRegistry& registry);

// The figures of the final report, for the outputs that carry them.
ReportFigures FiguresOf(const InputSummary& input, const Stats& stats, const TableRegistry& registry);

}  // namespace ravel_dump

#endif

// Sections of each table built with the test stream builder, shaped like what
// a one-segment multiplex carries.
#ifndef RAVEL_BENCH_BUILTSECTIONS_H
#define RAVEL_BENCH_BUILTSECTIONS_H

#include <vector>

#include "StreamBuilder.h"

namespace bench {

// PATs of 1, 4 and 16 programs; the one-segment PMT PID among them.
std::vector<Bytes> BuiltPatSections();
// AITs of one to three applications, each with an application, a name and a
// Ginga location descriptor.
std::vector<Bytes> BuiltAitSections();

}  // namespace bench

#endif

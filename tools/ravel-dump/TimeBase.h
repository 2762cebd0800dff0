// The time base of a broadcast's times. TDT, TOT and EIT carry local time, not
// UTC: Brasília time (UTC-3) under ABNT NBR 15603-2 and Japan Standard Time
// (UTC+9) under ARIB. The times are shown as broadcast, with that offset.
#ifndef RAVEL_DUMP_TIMEBASE_H
#define RAVEL_DUMP_TIMEBASE_H

#include <string>

#include "Summary.h"

namespace ravel_dump {

int UtcOffsetMinutesOf(int standard);

// "+09:00", "-03:00".
std::string UtcOffsetText(int utcOffsetMinutes);

// "2024-05-14T19:00:00-03:00", or "" for a time the broadcast did not give.
std::string Iso8601(const DateTime& time, int utcOffsetMinutes);

}  // namespace ravel_dump

#endif

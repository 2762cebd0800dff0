// The programme guide: every event of every EIT read (present/following and
// schedule, actual and other stream, table_id 0x4E to 0x6F). The event loops
// are walked here from the sections' bytes, since the library's EIT class
// refuses the schedule sections 0x51-0x5F and keeps one extended event
// descriptor of several; texts stay as broadcast.
#ifndef RAVEL_DUMP_EPG_H
#define RAVEL_DUMP_EPG_H

#include <vector>

#include "Summary.h"
#include "TableRegistry.h"

namespace ravel_dump {

// The events of the latest version of each EIT sub-table, each event once,
// ordered by service (network, stream, service) and start time.
std::vector<EpgEvent> BuildEpg(const TableRegistry& registry, bool brazil);

// A date and time as broadcast (16-bit MJD, then six BCD digits), read by
// the calendar; all ones (undefined) gives an invalid one.
DateTime BroadcastDateTime(const uint8_t* mjdAndBcd);

// The end of an event: its start plus its duration.
DateTime EventEnd(const EpgEvent& event);

}  // namespace ravel_dump

#endif

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

// PMTs of a one-segment service: video, audio, captions and a data stream,
// with stream identifier, data component and parental rating descriptors.
std::vector<Bytes> BuiltPmtSections();
// SDTs of 1 to 4 services with service and logo transmission descriptors.
std::vector<Bytes> BuiltSdtSections();
// A NIT with network name and system management descriptors and a transport
// stream carrying service list, TS information, delivery system and partial
// reception descriptors.
std::vector<Bytes> BuiltNitSections();
// BITs of 1 and 3 broadcasters, each with an extended broadcaster descriptor.
std::vector<Bytes> BuiltBitSections();
// EIT present/following and schedule sections of 1, 2 and 8 events with short
// event, component, audio component, content and parental rating descriptors.
std::vector<Bytes> BuiltEitSections();
// A TDT; TOTs without and with a local time offset descriptor.
std::vector<Bytes> BuiltTdtSections();
std::vector<Bytes> BuiltTotSections();

// Data carousel sections (table_id 0x3B: DSI, DII; 0x3C: DDB) whose message
// starts at byte 8: a DSI with 64 bytes of private data, DIIs of 1, 3 and 8
// modules with name, type, size and CRC descriptors, DDBs of 4066-byte blocks.
std::vector<Bytes> BuiltDsiSections();
std::vector<Bytes> BuiltDiiSections();
std::vector<Bytes> BuiltDdbSections();
// Stream descriptor sections (0x3D): an NPT reference and 1 to 4 general events.
std::vector<Bytes> BuiltStreamEventSections();

}  // namespace bench

#endif

// What a viewer of the channel wants to know, gathered from the tables read.
// Texts hold the broadcast's own bytes; the outputs decode them in the
// summary's text coding.
#ifndef RAVEL_DUMP_SUMMARY_H
#define RAVEL_DUMP_SUMMARY_H

#include <cstdint>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

#include "BroadcastText.h"

namespace ravel_dump {

// A date and time: as broadcast, read by the calendar, or as the library
// decodes it (its date rule included, which can give a 32nd day).
struct DateTime {
  bool valid = false;
  int year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
};

struct Duration {
  int hours = 0, minutes = 0, seconds = 0;
};

// A rating as broadcast and as the standard defines it, with the library's
// reading (content, minimumAge).
struct Rating {
  std::string country;
  int content = 0;
  int minimumAge = 0;
  int raw = -1;       // the rating byte, -1 where the guide has not read it
  std::string label;  // "L", "10" ... in Brazil, the minimum age elsewhere; "" when undefined
};

struct EventSummary {
  bool valid = false;
  int eventId = 0;
  DateTime start;         // as broadcast
  DateTime libraryStart;  // as the library reads it
  Duration duration;
  int runningStatus = 0;
  std::string language;  // of the short event
  std::string name;
  std::string text;
  std::vector<Rating> ratings;
};

struct StreamSummary {
  int streamType = 0;
  int pid = 0;
  int componentTag = -1;
};

struct ServiceSummary {
  int id = 0;
  int type = -1;  // from the SDT's service descriptor
  std::string name;
  std::string provider;
  bool oneSegment = false;
  int pmtPid = -1;
  int pcrPid = -1;
  int videoPid = -1;
  std::vector<int> audioPids;
  int captionPid = -1;
  std::vector<StreamSummary> streams;
  EventSummary present;
  EventSummary following;
};

struct TransportStreamSummary {
  int id = 0;
  int originalNetworkId = 0;
  std::string name;           // TS information descriptor
  int remoteControlKey = -1;
  int areaCode = -1;          // terrestrial delivery system descriptor
  int guardInterval = -1;
  int transmissionMode = -1;
  std::vector<unsigned int> frequencies;  // in the descriptor's units (1/7 MHz)
  std::vector<int> partialReception;         // service ids as broadcast
  std::vector<int> libraryPartialReception;  // as the library keeps them
  std::vector<std::pair<int, int>> serviceList;  // id, type
};

struct NetworkSummary {
  bool valid = false;
  int id = 0;
  std::string name;
  std::vector<TransportStreamSummary> streams;
};

struct LocalOffset {
  std::string country;
  int regionId = 0;
  int polarity = 0;
  int offsetHours = 0, offsetMinutes = 0;
  DateTime timeOfChange;         // as broadcast
  DateTime libraryTimeOfChange;  // as the library reads it
  int nextHours = 0, nextMinutes = 0;
};

struct TimeSummary {
  bool valid = false;
  std::string source;  // "TOT" or "TDT"
  DateTime time;         // as broadcast
  DateTime libraryTime;  // as the library reads it
  std::vector<LocalOffset> offsets;
};

struct ApplicationSummary {
  int pid = -1;
  int applicationType = 0;
  uint32_t organizationId = 0;
  uint32_t applicationId = 0;
  uint32_t controlCode = 0;
  int documentResolution = 0;
  std::string name;
  std::string path;
  std::string file;
  // The entry file, base directory and initial class joined, looked up in the
  // object carousels' trees (when there are any).
  std::string entry;
  bool entryChecked = false;
  bool entryPresent = false;
};

struct ModuleSummary {
  int id = 0;
  uint32_t size = 0;
  int version = 0;
  std::string name;         // name descriptor of the module info, if any
  unsigned int blocksReceived = 0;
  unsigned int blocksTotal = 0;
  bool complete = false;
  bool compressed = false;  // zlib, by the module info's compression descriptor
  uint32_t originalSize = 0;  // once inflated, as declared
  std::string problem;      // why --extract-modules could not inflate it
  std::string file;         // where --extract-modules wrote it
};

struct CarouselSummary {
  int pid = -1;
  uint32_t downloadId = 0;
  int blockSize = 0;
  std::vector<ModuleSummary> modules;
};

// One object of an object carousel's tree.
struct TreeEntrySummary {
  std::string path;   // "/" for the service gateway
  std::string kind;   // "service gateway", "directory", "file", "stream", "stream event"
  uint64_t size = 0;  // a file's content; the message body of the others
  int module = -1;
  int version = -1;   // of the module, -1 while it is not complete
  bool complete = false;
  std::string file;   // where --extract-files wrote it
};

struct ObjectCarouselSummary {
  int pid = -1;
  std::vector<TreeEntrySummary> entries;
  std::vector<std::string> problems;
};

// A service of any transport stream, from the latest SDT (actual or other)
// that describes it. The original network id is the one the section carries;
// the library's reading is kept beside it where it differs.
struct SdtService {
  int originalNetworkId = 0;
  int libraryOriginalNetworkId = 0;
  int transportStreamId = 0;
  bool actual = false;
  int id = 0;
  int type = -1;
  std::string name;
  std::string provider;
};

// A descriptor of a DSM-CC stream descriptor section (table_id 0x3D): a
// stream event with its id, NPT and private data, or an NPT reference.
struct StreamDescriptorSummary {
  int pid = -1;
  int extension = 0;  // table_id_extension (the event id for stream events)
  int version = 0;
  int tag = 0;
  std::string name;
  int eventId = -1;
  long long npt = -1;  // the event's NPT, or the NPT reference
  long long stc = -1;  // STC reference of an NPT reference
  int scaleNumerator = 0, scaleDenominator = 0;
  std::string privateData;  // bytes as broadcast
  std::size_t length = 0;
};

// The BIT (ISDB broadcasters), the latest version of each network's.
struct BroadcasterSummary {
  int id = 0;
  std::vector<std::pair<int, int>> descriptors;  // tag, length
};
struct BitSummary {
  int originalNetworkId = 0;
  int version = 0;
  bool viewPropriety = false;
  std::vector<std::pair<int, int>> descriptors;  // first loop: tag, length
  std::vector<BroadcasterSummary> broadcasters;
};

// A table the library has no class for, by the name its table_id has.
struct UnclassedTableSummary {
  std::string name;  // "" for a table_id no standard assigns
  int tableId = 0;
  int pid = -1;
  int extension = 0;
  int version = 0;
  std::size_t sections = 0;
  std::size_t bytes = 0;  // of its distinct sections
  uint64_t timesSeen = 0;
};

// A descriptor the library skipped, for each table it was skipped in.
struct SkippedDescriptorSummary {
  std::string table;  // the table's name
  int tableId = 0;
  int pid = -1;
  int extension = 0;
  int version = 0;
  int tag = 0;
  std::string name;
  int length = -1;  // -1 where unknown
  std::size_t times = 0;
};

// The final report's figures, for the JSON.
struct KindFigures {
  std::string kind;
  uint64_t sections = 0, distinct = 0, tables = 0, crcFailures = 0, malformed = 0, parseFailures = 0;
};
struct ReportFigures {
  bool rawSections = false;
  uint64_t bytes = 0, packets = 0, skippedBytes = 0, resyncs = 0;
  uint64_t sectionsAssembled = 0, crcFailures = 0, lengthMismatches = 0, malformed = 0, panics = 0, sectionsCut = 0;
  std::vector<KindFigures> kinds;
  std::vector<std::string> problems;
};

// One event of the programme guide (see Epg.h).
struct EpgRating {
  std::string country;
  int raw = 0;        // the rating byte as broadcast
  std::string label;  // as the country's standard defines it: "L", "14", "min 12", or "" (unknown)
};

struct EpgGenre {
  int level1 = 0, level2 = 0;  // content nibbles
  std::string name;            // of level 1, in the standard's genre table
};

struct EpgEvent {
  int tableId = 0;
  int originalNetworkId = 0, transportStreamId = 0, serviceId = 0;
  int eventId = 0;
  DateTime start;
  Duration duration;
  int runningStatus = 0;
  bool freeCaMode = false;
  std::string language;  // of the short event
  std::string name, text;
  // Every extended event descriptor joined in descriptor_number order: the
  // items (an item without a description goes on the one before) and the text.
  std::vector<std::pair<std::string, std::string>> items;
  std::string extendedText;
  std::vector<EpgRating> ratings;
  std::vector<EpgGenre> genres;

  bool Actual() const { return tableId == 0x4E || (tableId >= 0x50 && tableId <= 0x5F); }
  bool Schedule() const { return tableId >= 0x50; }
};

struct Summary {
  std::string standard;        // "brazil" or "japan"
  std::string standardReason;  // why: detected signs, or --standard
  TextCoding textCoding = TextCoding::kAsBroadcast;
  int utcOffsetMinutes = 0;    // time base of the broadcast's times
  int transportStreamId = -1;
  NetworkSummary network;
  std::vector<ServiceSummary> services;
  TimeSummary time;
  std::vector<ApplicationSummary> applications;
  std::vector<CarouselSummary> carousels;
  std::vector<ObjectCarouselSummary> objectCarousels;
  std::vector<SdtService> allServices;
  std::vector<BitSummary> bits;
  std::vector<StreamDescriptorSummary> streamDescriptors;
  std::vector<UnclassedTableSummary> tablesWithoutClass;
  std::vector<SkippedDescriptorSummary> skippedDescriptors;
  ReportFigures report;
  std::vector<EpgEvent> epg;
};

void PrintSummaryText(const Summary& summary, std::FILE* out);
// The JSON's layout is described by ravel-dump.schema.json; its version
// changes with every change of that layout.
const int kSummarySchemaVersion = 2;
std::string SummaryJson(const Summary& summary);
// The programme guide per service and day (--epg).
void PrintEpgText(const Summary& summary, std::FILE* out);
std::size_t EpgServiceCount(const std::vector<EpgEvent>& events);

// Names of codes, for the text summary.
const char* ServiceTypeName(int type);
const char* StreamTypeName(int type);
const char* ControlCodeName(uint32_t code);

}  // namespace ravel_dump

#endif

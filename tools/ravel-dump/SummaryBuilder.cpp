// The summary, from the latest version of each table read, through the
// objects the library made of its sections when they arrived.
#include <algorithm>
#include <cstring>
#include <map>
#include <tuple>

#include "Output.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CDescriptorNetworkName.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorPartialReception.h"
#include "Ravel_CDescriptorService.h"
#include "Ravel_CDescriptorServiceList.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CDescriptorStreamIdentifier.h"
#include "Ravel_CDescriptorTSInformation.h"
#include "Ravel_CDescriptorTerrDeliverySystem.h"
#include "Ravel_Cfg.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"
#include "DescriptorNames.h"
#include "Epg.h"
#include "SectionBytes.h"
#include "StandardDetection.h"
#include "TableNames.h"

namespace ravel_dump {
namespace {

const int kAnyPid = -2;

std::string Text(const char* text) { return text != nullptr ? std::string(text) : std::string(); }

std::string Field(const char* field, std::size_t capacity) {
  return std::string(field, strnlen(field, capacity));
}

// The table of `kind` seen last that `accept` takes, or null.
template <class Accept>
const TableEntry* Latest(const TableRegistry& registry, TableKind kind, Accept accept) {
  const TableEntry* latest = nullptr;
  for (const auto& entry : registry.Tables()) {
    if (entry->kind != kind || !accept(*entry)) continue;
    if (latest == nullptr || entry->lastSeen > latest->lastSeen) latest = entry.get();
  }
  return latest;
}

const TableEntry* Latest(const TableRegistry& registry, TableKind kind) {
  return Latest(registry, kind, [](const TableEntry&) { return true; });
}

// The object of class T the library made of a section (the table of tables
// chose the class by the section's kind).
template <class T>
T& Held(const StoredSection& section) {
  return static_cast<T&>(*section.parsed->GetTable());
}
template <>
RavelCTDT& Held<RavelCTDT>(const StoredSection& section) {
  return *section.parsed->GetTDT();
}
template <>
RavelCTOT& Held<RavelCTOT>(const StoredSection& section) {
  return *section.parsed->GetTOT();
}

// Calls `use(object)` for each section of `table` that the library accepted.
template <class T, class Use>
void EachSection(const TableEntry& table, Use use) {
  for (const auto& kv : table.sections) {
    if (kv.second.Parsed()) use(Held<T>(kv.second));
  }
}

ServiceSummary& ServiceOf(std::vector<ServiceSummary>& services, int id) {
  for (ServiceSummary& service : services)
    if (service.id == id) return service;
  services.push_back(ServiceSummary());
  services.back().id = id;
  return services.back();
}

DateTime MakeDateTime(int year, int month, int day, int hour, int minute, int second) {
  DateTime t;
  t.valid = true;
  t.year = year;
  t.month = month;
  t.day = day;
  t.hour = hour;
  t.minute = minute;
  t.second = second;
  return t;
}

DateTime MakeDateTime(const RavelCDateTime& d) {
  return MakeDateTime(d.iYear, d.iMonth, d.iDay, d.iHour, d.iMinute, d.iSecond);
}

// The PAT: the transport stream id and the services with their PMT PIDs.
void AddPat(const TableRegistry& registry, Summary& summary) {
  const TableEntry* table = Latest(registry, kRavelKindPAT, [](const TableEntry& t) { return t.pid <= 0; });
  if (table == nullptr) return;
  EachSection<RavelCPAT>(*table, [&](RavelCPAT& pat) {
    summary.transportStreamId = pat.iTableIdExtension;
    for (int i = 0; i < pat.aProgramList.iCount; ++i) {
      const RavelCPMTInfo* program = pat.aProgramList.ipArray[i];
      ServiceSummary& service = ServiceOf(summary.services, program->iProgramNumber);
      service.pmtPid = program->iPID;
      service.oneSegment = RavelPAT_IsOneSegPMTPID(program->iPID);
    }
  });
}

// Each service's PMT: the PIDs the receiver would play. A PMT the PAT does
// not list is on the air all the same: its program is listed too.
void AddPmts(const TableRegistry& registry, Summary& summary) {
  for (const auto& entry : registry.Tables()) {
    if (entry->kind == kRavelKindPMT) ServiceOf(summary.services, entry->extension);
  }
  for (ServiceSummary& service : summary.services) {
    const TableEntry* table = Latest(registry, kRavelKindPMT, [&](const TableEntry& t) {
      return t.extension == service.id && (service.pmtPid < 0 || t.pid == service.pmtPid || t.pid == kNoPid);
    });
    if (table == nullptr) continue;
    RavelCPMT pmt(nullptr);
    bool any = false;
    EachSection<RavelCPMT>(*table, [&](RavelCPMT& section) {
      if (!any) {
        pmt = section;
        any = true;
      } else {
        pmt += section;
      }
    });
    if (!any) continue;
    if (service.pmtPid < 0 && table->pid != kNoPid) service.pmtPid = table->pid;
    service.pcrPid = pmt.iPCRPID;
    unsigned short video = pmt.GetVideoPID();
    service.videoPid = video != 0 ? video : -1;
    for (unsigned char n = 0, count = pmt.GetAudioPIDCount(); n < count; ++n) {
      service.audioPids.push_back(pmt.GetAudioPID(n));
    }
    unsigned short captions = pmt.GetCCPID();
    service.captionPid = captions != 0 ? captions : -1;
    for (int i = 0; i < pmt.aMapInfoList.iCount; ++i) {
      const RavelCMapInfo* info = pmt.aMapInfoList.ipArray[i];
      StreamSummary stream;
      stream.streamType = info->iStreamType;
      stream.pid = info->iElementaryPID;
      if (info->pStreamIdentifier != nullptr) stream.componentTag = info->pStreamIdentifier->iComponentTag;
      service.streams.push_back(stream);
    }
  }
}

// The SDT of this stream: service types, names and providers.
void AddSdt(const TableRegistry& registry, Summary& summary) {
  int tsId = summary.transportStreamId;
  const TableEntry* table = Latest(registry, kRavelKindSDT, [&](const TableEntry& t) {
    return !RavelCSafeSection::DescribesOtherStream(t.tableId) && (tsId < 0 || t.extension == tsId);
  });
  if (table == nullptr) return;
  if (summary.transportStreamId < 0) summary.transportStreamId = table->extension;
  EachSection<RavelCSDT>(*table, [&](RavelCSDT& sdt) {
    for (int i = 0; i < sdt.aServiceList.iCount; ++i) {
      const RavelCServiceDescription* description = sdt.aServiceList.ipArray[i];
      ServiceSummary& service = ServiceOf(summary.services, description->iServiceId);
      if (description->pService != nullptr) {
        service.type = description->pService->iServiceType;
        service.name = Text(description->pService->pServiceName);
        service.provider = Text(description->pService->pServiceProviderName);
      }
    }
  });
}

// The services of every transport stream: the latest version of each SDT,
// actual and other, by its stream and network.
void AddAllServices(const TableRegistry& registry, Summary& summary) {
  typedef std::tuple<int, int, int> SdtKey;  // network, stream, table_id
  std::map<SdtKey, const TableEntry*> latest = LatestTables<SdtKey>(registry, [](const TableEntry& t, SdtKey& key) {
    const StoredSection& first = t.sections.begin()->second;
    if (t.kind != kRavelKindSDT || first.Size() < 10) return false;
    key = SdtKey((first.Bytes()[8] << 8) | first.Bytes()[9], t.extension, t.tableId);
    return true;
  });
  for (const auto& kv : latest) {
    for (const auto& section : kv.second->sections) {
      if (!section.second.Parsed()) continue;
      RavelCSDT& sdt = Held<RavelCSDT>(section.second);
      for (int i = 0; i < sdt.aServiceList.iCount; ++i) {
        const RavelCServiceDescription* description = sdt.aServiceList.ipArray[i];
        SdtService service;
        service.originalNetworkId = std::get<0>(kv.first);
        service.libraryOriginalNetworkId = sdt.GetOriginalNetworkId();
        service.transportStreamId = std::get<1>(kv.first);
        service.actual = !RavelCSafeSection::DescribesOtherStream(std::get<2>(kv.first));
        service.id = description->iServiceId;
        if (description->pService != nullptr) {
          service.type = description->pService->iServiceType;
          service.name = Text(description->pService->pServiceName);
          service.provider = Text(description->pService->pServiceProviderName);
        }
        summary.allServices.push_back(service);
      }
    }
  }
}

// Calls `use(tsid, onid, tag, body, length)` for each descriptor of the
// transport stream loop of a NIT section, read from its bytes; a loop that
// overruns the section ends the walk.
template <class Use>
void EachTsDescriptor(const uint8_t* s, std::size_t size, Use use) {
  const std::size_t end = size >= 4 ? size - 4 : 0;
  std::size_t at = 8;
  if (at + 2 > end) return;
  at += 2 + (((s[at] & 0x0F) << 8) | s[at + 1]);
  if (at + 2 > end) return;
  at += 2;
  while (at + 6 <= end) {
    const int tsid = (s[at] << 8) | s[at + 1];
    const int onid = (s[at + 2] << 8) | s[at + 3];
    const std::size_t loopEnd = at + 6 + (((s[at + 4] & 0x0F) << 8) | s[at + 5]);
    if (loopEnd > end) return;
    EachDescriptor(s + at + 6, loopEnd - at - 6, [&](uint8_t tag, const uint8_t* body, std::size_t length) {
      use(tsid, onid, tag, body, length);
    });
    at = loopEnd;
  }
}

// The partial reception descriptor's service ids as broadcast (16 bits each),
// beside the library's reading.
void AddPartialReception(const TableEntry& table, NetworkSummary& network) {
  const uint8_t kPartialReceptionTag = 0xFB;
  for (const auto& kv : table.sections) {
    EachTsDescriptor(kv.second.Bytes(), kv.second.Size(),
                     [&](int tsid, int onid, uint8_t tag, const uint8_t* body, std::size_t length) {
                       if (tag != kPartialReceptionTag) return;
                       for (TransportStreamSummary& ts : network.streams) {
                         if (ts.id != tsid || ts.originalNetworkId != onid || !ts.partialReception.empty()) continue;
                         for (std::size_t i = 0; i + 2 <= length; i += 2) {
                           ts.partialReception.push_back((body[i] << 8) | body[i + 1]);
                         }
                       }
                     });
  }
}

// The NIT of this network: its name and transport streams.
void AddNit(const TableRegistry& registry, Summary& summary) {
  const TableEntry* table = Latest(registry, kRavelKindNIT, [](const TableEntry& t) { return !RavelCSafeSection::DescribesOtherStream(t.tableId); });
  if (table == nullptr) return;
  NetworkSummary& network = summary.network;
  network.id = table->extension;
  EachSection<RavelCNIT>(*table, [&](RavelCNIT& nit) {
    network.valid = true;
    if (nit.pNetworkName != nullptr && network.name.empty()) network.name = Text(nit.pNetworkName->GetNetworkName());
    for (int i = 0; i < nit.aTSInfoList.iCount; ++i) {
      const RavelCTSInfo* info = nit.aTSInfoList.ipArray[i];
      TransportStreamSummary ts;
      ts.id = info->iTransportStreamId;
      ts.originalNetworkId = info->iOriginalNetworkId;
      if (const RavelCTSInformationDescriptor* tsInfo = info->pTSInformation) {
        ts.name = Text(tsInfo->GetTsName());
        ts.remoteControlKey = tsInfo->iRemoteControlKeyId;
      }
      if (const RavelCTerrDeliverySystemDescriptor* delivery = info->pTerrDeliverySystem) {
        ts.areaCode = delivery->iAreaCode;
        ts.guardInterval = delivery->iGuardInterval;
        ts.transmissionMode = delivery->iTransmissionMode;
        for (int f = 0; f < delivery->iFrequencyCount && delivery->pFrequencies != nullptr; ++f) {
          ts.frequencies.push_back(delivery->pFrequencies[f]);
        }
      }
      if (const RavelCPartialReceptionDescriptor* partial = info->pPartialReception) {
        for (int s = 0; s < partial->aServiceIds.iCount; ++s) {
          ts.libraryPartialReception.push_back(partial->aServiceIds.ipArray[s]);
        }
      }
      if (const RavelCServiceListDescriptor* list = info->pServiceList) {
        for (int s = 0; s < list->iServiceCount && list->pServiceIds != nullptr; ++s) {
          ts.serviceList.push_back({list->pServiceIds[s], list->pServiceTypes[s]});
        }
      }
      network.streams.push_back(ts);
    }
  });
  AddPartialReception(*table, network);
}

EventSummary MakeEvent(RavelCEventInfo& info) {
  EventSummary event;
  event.valid = true;
  event.eventId = info.iEventId;
  event.libraryStart = MakeDateTime(info.cStartTime);
  event.start = event.libraryStart;  // until the guide's reading of the bytes replaces it
  event.duration.hours = info.iDurationHour;
  event.duration.minutes = info.iDurationMinute;
  event.duration.seconds = info.iDurationSecond;
  event.runningStatus = info.iRunningStatus;
  if (const RavelCShortEventDescriptor* shortEvent = info.pShortEventDescriptor) {
    event.language = Field(shortEvent->szLanguageCode, sizeof shortEvent->szLanguageCode);
    event.name = Text(shortEvent->pEventName);
    event.text = Text(shortEvent->pEventDescription);
  }
  if (RavelCParentalRatingDescriptor* rating = info.pParentalRatingDescriptor) {
    for (int i = 0; i < rating->aParentalRatings.iCount; ++i) {
      const RavelCParentalRating* entry = rating->aParentalRatings.ipArray[i];
      Rating r;
      r.country = Field(entry->szCountryCode, sizeof entry->szCountryCode);
      r.content = entry->iContent;
      r.minimumAge = entry->iMinimumAge;
      event.ratings.push_back(r);
    }
  }
  return event;
}

// The start and rating bytes as broadcast, from the guide's reading of the same event.
void AddBroadcastReading(const std::vector<EpgEvent>& epg, int tableId, int serviceId, EventSummary& event) {
  for (const EpgEvent& e : epg) {
    if (e.tableId != tableId || e.serviceId != serviceId || e.eventId != event.eventId) continue;
    event.start = e.start;
    for (std::size_t i = 0; i < event.ratings.size() && i < e.ratings.size(); ++i) {
      event.ratings[i].raw = e.ratings[i].raw;
      event.ratings[i].label = e.ratings[i].label;
    }
    return;
  }
}

// Present (section 0) and following (section 1) events of each service, from
// the EIT present/following of the actual stream.
void AddEvents(const TableRegistry& registry, Summary& summary) {
  for (ServiceSummary& service : summary.services) {
    const TableEntry* table = Latest(registry, kRavelKindEITPresentFollowing, [&](const TableEntry& t) {
      return !RavelCSafeSection::DescribesOtherStream(t.tableId) && t.extension == service.id;
    });
    if (table == nullptr) continue;
    for (const auto& kv : table->sections) {
      if (kv.first > 1 || !kv.second.Parsed()) continue;
      RavelCEIT& eit = Held<RavelCEIT>(kv.second);
      if (eit.aEventInfo.iCount == 0) continue;
      EventSummary event = MakeEvent(*eit.aEventInfo.ipArray[0]);
      AddBroadcastReading(summary.epg, table->tableId, service.id, event);
      (kv.first == 0 ? service.present : service.following) = event;
    }
  }
}

// The TDT's or TOT's time as broadcast (bytes 3 to 7), and the times of change
// of the TOT's local time offsets, in the order of its descriptor loop.
const std::size_t kTimeOffset = 3, kTimeSize = 5, kTotLoopOffset = 10, kLocalOffsetSize = 13, kTimeOfChange = 6;
const uint8_t kLocalTimeOffsetTag = 0x58;

DateTime BroadcastTime(const TableEntry& table) {
  const StoredSection& section = table.sections.begin()->second;
  return section.Size() >= kTimeOffset + kTimeSize ? BroadcastDateTime(section.Bytes() + kTimeOffset) : DateTime();
}

std::vector<DateTime> BroadcastTimesOfChange(const TableEntry& tot) {
  std::vector<DateTime> times;
  const StoredSection& section = tot.sections.begin()->second;
  const uint8_t* bytes = section.Bytes();
  if (section.Size() < kTotLoopOffset) return times;
  const std::size_t loop = std::min<std::size_t>(((bytes[8] & 0x0F) << 8) | bytes[9], section.Size() - kTotLoopOffset);
  EachDescriptor(bytes + kTotLoopOffset, loop, [&](uint8_t tag, const uint8_t* body, std::size_t length) {
    if (tag != kLocalTimeOffsetTag) return;
    for (std::size_t at = 0; at + kLocalOffsetSize <= length; at += kLocalOffsetSize)
      times.push_back(BroadcastDateTime(body + at + kTimeOfChange));
  });
  return times;
}

// The broadcast time: the latest TOT (with the local time offset), else the latest TDT.
void AddTime(const TableRegistry& registry, Summary& summary) {
  TimeSummary& time = summary.time;
  if (const TableEntry* table = Latest(registry, kRavelKindTOT)) {
    EachSection<RavelCTOT>(*table, [&](RavelCTOT& tot) {
      time.valid = true;
      time.source = "TOT";
      time.libraryTime = MakeDateTime(tot.iYear, tot.iMonth, tot.iDay, tot.iHour, tot.iMinute, tot.iSecond);
      time.time = BroadcastTime(*table);
      const std::vector<DateTime> changes = BroadcastTimesOfChange(*table);
      if (RavelCLocalTimeOffsetDescriptor* offsets = tot.pLocalTimeOffsetDescriptor) {
        for (int i = 0; i < offsets->aLocalTimeOffsets.iCount; ++i) {
          const RavelCLocalTimeOffset* entry = offsets->aLocalTimeOffsets.ipArray[i];
          LocalOffset o;
          o.country = Field(entry->szCountryCode, sizeof entry->szCountryCode);
          o.regionId = entry->iCountryRegionId;
          o.polarity = entry->iLocalTimeOffsetPolarity;
          o.offsetHours = entry->iLocalTimeOffsetHour;
          o.offsetMinutes = entry->iLocalTimeOffsetMinute;
          o.libraryTimeOfChange = MakeDateTime(entry->cTimeOfChange);
          if (static_cast<std::size_t>(i) < changes.size()) o.timeOfChange = changes[i];
          o.nextHours = entry->iNextTimeOffsetHour;
          o.nextMinutes = entry->iNextTimeOffsetMinute;
          time.offsets.push_back(o);
        }
      }
    });
  }
  if (time.valid) return;
  if (const TableEntry* table = Latest(registry, kRavelKindTDT)) {
    EachSection<RavelCTDT>(*table, [&](RavelCTDT& tdt) {
      time.valid = true;
      time.source = "TDT";
      time.libraryTime = MakeDateTime(tdt.iYear, tdt.iMonth, tdt.iDay, tdt.iHour, tdt.iMinute, tdt.iSecond);
      time.time = BroadcastTime(*table);
    });
  }
}

// Every AIT section stands alone: the applications of all of them, each once.
void AddApplications(const TableRegistry& registry, Summary& summary) {
  for (const auto& entry : registry.Tables()) {
    if (entry->kind != kRavelKindAIT) continue;
    for (const auto& kv : entry->sections) {
      if (!kv.second.Parsed()) continue;
      RavelCAIT& ait = Held<RavelCAIT>(kv.second);
      RavelCArray<GingaAITApplicationType>* list = ait.GetApplicationList();
      for (int i = 0; i < list->iCount; ++i) {
        const GingaAITApplicationType& record = list->ipArray[i];
        ApplicationSummary app;
        app.pid = entry->pid;
        app.applicationType = ait.iTableIdExtension;
        app.organizationId = record.iOrganizationId;
        app.applicationId = record.iApplicationId;
        app.controlCode = record.iApplicationControlCode;
        app.documentResolution = record.iDocumentResolution;
        app.name = Field(record.szAppName, sizeof record.szAppName);
        app.path = Field(record.szAppFilePath, sizeof record.szAppFilePath);
        app.file = Field(record.szAppFileName, sizeof record.szAppFileName);
        bool repeated = false;
        for (const ApplicationSummary& other : summary.applications) {
          repeated = repeated || (other.pid == app.pid && other.applicationType == app.applicationType &&
                                  other.organizationId == app.organizationId &&
                                  other.applicationId == app.applicationId && other.controlCode == app.controlCode &&
                                  other.name == app.name && other.path == app.path && other.file == app.file);
        }
        if (!repeated) summary.applications.push_back(app);
      }
    }
  }
}

// Descriptors of a loop as (tag, length), up to where one overruns it.
std::vector<std::pair<int, int>> DescriptorList(const uint8_t* p, std::size_t n) {
  std::vector<std::pair<int, int>> list;
  EachDescriptor(p, n, [&](uint8_t tag, const uint8_t*, std::size_t length) {
    list.push_back({tag, static_cast<int>(length)});
  });
  return list;
}

// The BIT of each network, read from its sections' bytes.
void AddBits(const TableRegistry& registry, Summary& summary) {
  std::map<int, const TableEntry*> latest = LatestTables<int>(registry, [](const TableEntry& t, int& network) {
    network = t.extension;
    return t.kind == kRavelKindBIT;
  });
  for (const auto& kv : latest) {
    BitSummary bit;
    bit.originalNetworkId = kv.first;
    bit.version = kv.second->version;
    for (const auto& section : kv.second->sections) {
      const uint8_t* s = section.second.Bytes();
      const std::size_t end = section.second.Size() >= 14 ? section.second.Size() - 4 : 0;
      if (end < 10) continue;
      bit.viewPropriety = (s[8] & 0x10) != 0;
      std::size_t at = 10 + (((s[8] & 0x0F) << 8) | s[9]);
      if (at > end) continue;
      std::vector<std::pair<int, int>> first = DescriptorList(s + 10, at - 10);
      bit.descriptors.insert(bit.descriptors.end(), first.begin(), first.end());
      while (at + 3 <= end) {
        const std::size_t loopEnd = at + 3 + (((s[at + 1] & 0x0F) << 8) | s[at + 2]);
        if (loopEnd > end) break;
        BroadcasterSummary broadcaster;
        broadcaster.id = s[at];
        broadcaster.descriptors = DescriptorList(s + at + 3, loopEnd - at - 3);
        bit.broadcasters.push_back(broadcaster);
        at = loopEnd;
      }
    }
    summary.bits.push_back(bit);
  }
}

// Tables the library has no class for, by name, with their size and counts.
void AddTablesWithoutClass(const TableRegistry& registry, Summary& summary) {
  for (const auto& entry : registry.Tables()) {
    if (!WithoutClass(*entry)) continue;
    UnclassedTableSummary table;
    table.name = TableIdName(entry->tableId);
    table.tableId = entry->tableId;
    table.pid = entry->pid;
    table.extension = entry->extension;
    table.version = entry->version;
    table.sections = entry->sections.size();
    for (const auto& kv : entry->sections) table.bytes += kv.second.Size();
    table.timesSeen = entry->TimesSeen();
    summary.tablesWithoutClass.push_back(table);
  }
}

void AddSkippedDescriptors(const TableRegistry& registry, Summary& summary) {
  for (const auto& entry : registry.Tables()) {
    for (const SkippedCount& c : TableSkipped(*entry)) {
      SkippedDescriptorSummary d;
      d.table = TableName(*entry);
      d.tableId = entry->tableId;
      d.pid = entry->pid;
      d.extension = entry->extension;
      d.version = entry->version;
      d.tag = c.descriptor.tag;
      d.name = DescriptorName(c.descriptor.tag);
      d.length = c.descriptor.length;
      d.times = c.times;
      summary.skippedDescriptors.push_back(d);
    }
  }
}

}  // namespace

ReportFigures FiguresOf(const InputSummary& input, const Stats& stats, const TableRegistry& registry) {
  ReportFigures figures;
  figures.rawSections = input.sections;
  figures.bytes = input.bytes;
  figures.packets = input.packets;
  figures.skippedBytes = input.skippedBytes;
  figures.resyncs = input.resyncs;
  figures.sectionsAssembled = stats.sectionsAssembled;
  figures.crcFailures = stats.crcFailures;
  figures.lengthMismatches = stats.lengthMismatches;
  figures.malformed = stats.malformed;
  figures.panics = stats.panics;
  figures.sectionsCut = stats.sectionsCut;
  uint64_t tables[kRavelKindCount] = {};
  for (const auto& table : registry.Tables()) ++tables[table->kind];
  for (int k = 0; k < kRavelKindCount; ++k) {
    const KindStats& s = stats.kinds[k];
    if (s.sections == 0 && s.crcFailures == 0 && s.malformed == 0 && tables[k] == 0) continue;
    KindFigures kind;
    kind.kind = RavelCSafeSection::GetKindName(static_cast<TableKind>(k));
    kind.sections = s.sections;
    kind.distinct = s.distinct;
    kind.tables = tables[k];
    kind.crcFailures = s.crcFailures;
    kind.malformed = s.malformed;
    kind.parseFailures = s.parseFailures;
    figures.kinds.push_back(kind);
  }
  figures.problems = stats.problems;
  return figures;
}

Summary BuildSummary(const TableRegistry& registry, const CarouselCollector& carousel, TraceOutput& trace) {
  TraceOutput::QuietScope quiet(trace);
  Summary summary;
  summary.standard = StandardName(RavelCfg_GetStandard());
  AddPat(registry, summary);
  AddSdt(registry, summary);
  AddPmts(registry, summary);
  AddNit(registry, summary);
  summary.epg = BuildEpg(registry, RavelCfg_GetStandard() != RAVEL_STANDARD_JAPAN);
  AddEvents(registry, summary);
  AddTime(registry, summary);
  AddApplications(registry, summary);
  AddAllServices(registry, summary);
  AddTablesWithoutClass(registry, summary);
  AddSkippedDescriptors(registry, summary);
  AddBits(registry, summary);
  summary.streamDescriptors = BuildStreamDescriptors(registry);
  summary.carousels = carousel.Summarize();
  return summary;
}

}  // namespace ravel_dump

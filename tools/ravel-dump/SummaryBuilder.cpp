// The summary, from the latest version of each table read.
#include <map>

#include "ByteText.h"
#include "Output.h"
#include "ParseBuffer.h"
#include "RavelSectionParser.h"

namespace ravel_dump {
namespace {

// The table of `kind` seen last (on `pid` when given), or null.
const TableEntry* Latest(const TableRegistry& registry, TableKind kind, int pid = -2) {
  const TableEntry* latest = nullptr;
  for (const auto& entry : registry.Tables()) {
    if (entry->kind != kind || (pid != -2 && entry->pid != pid)) continue;
    if (latest == nullptr || entry->lastSeen > latest->lastSeen) latest = entry.get();
  }
  return latest;
}

const StoredSection* FirstParsed(const TableEntry& table) {
  for (const auto& kv : table.sections)
    if (kv.second.parseResult == 0) return &kv.second;
  return nullptr;
}

ServiceSummary& ServiceOf(std::vector<ServiceSummary>& services, int id) {
  for (ServiceSummary& service : services)
    if (service.id == id) return service;
  services.push_back(ServiceSummary());
  services.back().id = id;
  return services.back();
}

void AddPat(const TableRegistry& registry, Summary& summary) {
  const TableEntry* table = Latest(registry, TableKind::kPat, 0x0000);
  if (table == nullptr) table = Latest(registry, TableKind::kPat);
  if (table == nullptr) return;
  const StoredSection* section = FirstParsed(*table);
  if (section == nullptr) return;
  ParseBuffer buffer(section->bytes);
  RavelCPAT pat(nullptr);
  if (pat.ParseRawData(buffer.Section()) != 0) return;
  summary.transportStreamId = pat.iTableIdExtension;
  for (int i = 0; i < pat.aProgramList.iCount; ++i) {
    const RavelCPMTInfo* program = pat.aProgramList.ipArray[i];
    ServiceSummary& service = ServiceOf(summary.services, program->iProgramNumber);
    service.pmtPid = program->iPID;
    // The PAT keeps the first program with a one-segment PMT PID apart.
    service.oneSegment = program->iPID >= 0x1FC8 && program->iPID <= 0x1FCF;
  }
}

void AddApplications(const TableRegistry& registry, Summary& summary) {
  // Every AIT section stands alone: all current ones count, in the order seen.
  for (const auto& entry : registry.Tables()) {
    if (entry->kind != TableKind::kAit) continue;
    for (const auto& kv : entry->sections) {
      if (kv.second.parseResult != 0) continue;
      ParseBuffer buffer(kv.second.bytes);
      RavelCAIT ait;
      if (ait.ParseRawData(buffer.Section()) != 0) continue;
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
        app.name = std::string(record.szAppName, strnlen(record.szAppName, sizeof record.szAppName));
        app.path = std::string(record.szAppFilePath, strnlen(record.szAppFilePath, sizeof record.szAppFilePath));
        app.file = std::string(record.szAppFileName, strnlen(record.szAppFileName, sizeof record.szAppFileName));
        bool repeated = false;
        for (const ApplicationSummary& other : summary.applications) {
          repeated = repeated || (other.pid == app.pid && other.organizationId == app.organizationId &&
                                  other.applicationId == app.applicationId && other.controlCode == app.controlCode &&
                                  other.name == app.name && other.path == app.path && other.file == app.file);
        }
        if (!repeated) summary.applications.push_back(app);
      }
    }
  }
}

}  // namespace

Summary BuildSummary(const TableRegistry& registry, const TableFilter& filter, const CarouselCollector& carousel,
                     Stats& stats) {
  (void)filter;
  (void)stats;
  Summary summary;
  summary.standard = RavelCfg_GetStandard() == 1 ? "japan" : "brazil";
  AddPat(registry, summary);
  AddApplications(registry, summary);
  summary.carousels = carousel.Summarize();
  return summary;
}

}  // namespace ravel_dump

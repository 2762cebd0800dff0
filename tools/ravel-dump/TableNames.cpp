#include "TableNames.h"

#include <algorithm>

namespace ravel_dump {

std::string TableIdName(uint8_t tableId) {
  struct Named {
    uint8_t tableId;
    const char* name;
  };
  static const Named kNames[] = {
      {0x00, "PAT"},  {0x01, "CAT"},  {0x02, "PMT"},  {0x03, "TSDT"}, {0x3A, "DSM-CC multiprotocol"},
      {0x3B, "DSM-CC U-N message"}, {0x3C, "DSM-CC download data"}, {0x3D, "DSM-CC stream descriptors"},
      {0x3E, "DSM-CC private data"}, {0x40, "NIT"}, {0x41, "NIT other"}, {0x42, "SDT"}, {0x46, "SDT other"},
      {0x4A, "BAT"},  {0x4E, "EIT present/following"}, {0x4F, "EIT present/following other"},
      {0x70, "TDT"},  {0x71, "RST"},  {0x72, "ST"},   {0x73, "TOT"},  {0x74, "AIT"},  {0x7E, "DIT"},
      {0x7F, "SIT"},  {0xC0, "DCT"},  {0xC1, "DLT"},  {0xC2, "PCAT"}, {0xC3, "SDTT"}, {0xC4, "BIT"},
      {0xC5, "NBIT body"}, {0xC6, "NBIT reference"}, {0xC7, "LDT"}, {0xC8, "CDT"}, {0xD0, "LIT"},
      {0xD1, "ERT"},  {0xD2, "ITT"},  {0xFE, "AMT"},
  };
  for (const Named& named : kNames) {
    if (named.tableId == tableId) return named.name;
  }
  if (tableId >= 0x50 && tableId <= 0x5F) return "EIT schedule";
  if (tableId >= 0x60 && tableId <= 0x6F) return "EIT schedule other";
  return std::string();
}

std::string TableName(const TableEntry& table) {
  std::string name = table.kind == kRavelKindOther ? TableIdName(table.tableId) : std::string();
  return name.empty() ? std::string(RavelCSafeSection::GetKindName(table.kind)) : name;
}

std::vector<SkippedCount> TableSkipped(const TableEntry& table) {
  std::vector<SkippedCount> counts;
  for (const auto& kv : table.sections) {
    for (const SkippedDescriptor& d : kv.second.skipped) {
      auto same = std::find_if(counts.begin(), counts.end(), [&](const SkippedCount& c) {
        return c.descriptor.tag == d.tag && c.descriptor.length == d.length;
      });
      if (same == counts.end()) same = counts.insert(counts.end(), SkippedCount{d, 0});
      ++same->times;
    }
  }
  return counts;
}

bool WithoutClass(const TableEntry& table) {
  for (const auto& kv : table.sections) {
    if (kv.second.result != kRavelSafeUnknownTable) return false;
  }
  return true;
}

}  // namespace ravel_dump

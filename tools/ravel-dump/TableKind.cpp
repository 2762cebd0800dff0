#include "TableKind.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>

namespace ravel_dump {
namespace {

struct KindInfo {
  TableKind kind;
  const char* name;
  const char* word;
};

const KindInfo kKinds[] = {
    {TableKind::kPat, "PAT", "pat"},
    {TableKind::kCat, "CAT", "cat"},
    {TableKind::kPmt, "PMT", "pmt"},
    {TableKind::kNit, "NIT", "nit"},
    {TableKind::kSdt, "SDT", "sdt"},
    {TableKind::kEitPf, "EIT p/f", "eit-pf"},
    {TableKind::kEitSchedule, "EIT schedule", "eit-schedule"},
    {TableKind::kTdt, "TDT", "tdt"},
    {TableKind::kTot, "TOT", "tot"},
    {TableKind::kBit, "BIT", "bit"},
    {TableKind::kAit, "AIT", "ait"},
    {TableKind::kDsi, "DSI", "dsi"},
    {TableKind::kDii, "DII", "dii"},
    {TableKind::kDdb, "DDB", "ddb"},
    {TableKind::kDsmccOther, "DSM-CC other", "dsmcc-other"},
    {TableKind::kStreamDescriptors, "stream descriptors", "stream-events"},
    {TableKind::kOther, "other", "other"},
};

std::string Lower(std::string text) {
  std::transform(text.begin(), text.end(), text.begin(),
                 [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  return text;
}

}  // namespace

TableKind KindOfSection(const uint8_t* section, std::size_t size) {
  uint8_t tableId = section[0];
  switch (tableId) {
    case 0x00:
      return TableKind::kPat;
    case 0x01:
      return TableKind::kCat;
    case 0x02:
      return TableKind::kPmt;
    case 0x40:
    case 0x41:
      return TableKind::kNit;
    case 0x42:
    case 0x46:
      return TableKind::kSdt;
    case 0x4E:
    case 0x4F:
      return TableKind::kEitPf;
    case 0x70:
      return TableKind::kTdt;
    case 0x73:
      return TableKind::kTot;
    case 0x74:
      return TableKind::kAit;
    case 0xC4:
      return TableKind::kBit;
    case 0x3B:
    case 0x3C: {
      if (size < 12) return TableKind::kDsmccOther;
      unsigned int messageId = (section[10] << 8) | section[11];
      if (messageId == 0x1006) return TableKind::kDsi;
      if (messageId == 0x1002) return TableKind::kDii;
      if (messageId == 0x1003) return TableKind::kDdb;
      return TableKind::kDsmccOther;
    }
    case 0x3D:
      return TableKind::kStreamDescriptors;
    default:
      break;
  }
  if (tableId >= 0x50 && tableId <= 0x6F) return TableKind::kEitSchedule;
  return TableKind::kOther;
}

const char* KindName(TableKind kind) {
  for (const KindInfo& info : kKinds)
    if (info.kind == kind) return info.name;
  return "?";
}

const char* KindWord(TableKind kind) {
  for (const KindInfo& info : kKinds)
    if (info.kind == kind) return info.word;
  return "?";
}

bool KindJoinsSections(TableKind kind) {
  switch (kind) {
    case TableKind::kPmt:
    case TableKind::kNit:
    case TableKind::kSdt:
    case TableKind::kEitPf:
    case TableKind::kEitSchedule:
    case TableKind::kBit:
      return true;
    default:
      return false;
  }
}

bool ParseNumber(const std::string& text, unsigned long max, unsigned long& value) {
  if (text.empty()) return false;
  const char* begin = text.c_str();
  char* end = nullptr;
  int base = 10;
  if (text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X')) {
    base = 16;
    begin += 2;
  }
  if (!std::isxdigit(static_cast<unsigned char>(*begin))) return false;
  unsigned long parsed = std::strtoul(begin, &end, base);
  if (*end != '\0' || parsed > max) return false;
  value = parsed;
  return true;
}

bool TableFilter::Parse(const std::string& list, std::string& error) {
  std::size_t start = 0;
  while (start <= list.size()) {
    std::size_t comma = list.find(',', start);
    if (comma == std::string::npos) comma = list.size();
    std::string word = Lower(list.substr(start, comma - start));
    start = comma + 1;
    if (word.empty()) continue;
    unsigned long number = 0;
    if (ParseNumber(word, 0xFF, number)) {
      tableIds_.push_back(static_cast<int>(number));
      continue;
    }
    if (word == "eit") {
      kinds_.push_back(TableKind::kEitPf);
      kinds_.push_back(TableKind::kEitSchedule);
      continue;
    }
    if (word == "dsmcc") {
      for (TableKind k : {TableKind::kDsi, TableKind::kDii, TableKind::kDdb, TableKind::kDsmccOther,
                          TableKind::kStreamDescriptors})
        kinds_.push_back(k);
      continue;
    }
    bool known = false;
    for (const KindInfo& info : kKinds) {
      if (word == info.word) {
        kinds_.push_back(info.kind);
        known = true;
      }
    }
    if (!known) {
      error = "unknown table '" + word + "' (use a table_id or one of: pat, cat, pmt, nit, sdt, eit, " +
              "eit-pf, eit-schedule, tdt, tot, bit, ait, dsi, dii, ddb, dsmcc, stream-events, other)";
      return false;
    }
  }
  return true;
}

bool TableFilter::Accepts(TableKind kind, uint8_t tableId) const {
  if (Empty()) return true;
  if (std::find(kinds_.begin(), kinds_.end(), kind) != kinds_.end()) return true;
  return std::find(tableIds_.begin(), tableIds_.end(), static_cast<int>(tableId)) != tableIds_.end();
}

}  // namespace ravel_dump

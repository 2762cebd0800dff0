#include "TableKind.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>

namespace ravel_dump {
namespace {

// By kind, in the library's order.
const char* const kKindWords[kRavelKindCount] = {
    "pat", "cat", "pmt", "nit", "sdt", "eit-pf", "eit-schedule", "tdt", "tot", "bit", "ait",
    "dsi", "dii", "ddb", "dsmcc-other", "stream-events", "other",
};

std::string Lower(std::string text) {
  std::transform(text.begin(), text.end(), text.begin(),
                 [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
  return text;
}

}  // namespace

const char* KindWord(TableKind kind) { return kind >= 0 && kind < kRavelKindCount ? kKindWords[kind] : "?"; }

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
      kinds_.push_back(kRavelKindEITPresentFollowing);
      kinds_.push_back(kRavelKindEITSchedule);
      continue;
    }
    if (word == "dsmcc") {
      for (TableKind k : {kRavelKindDSI, kRavelKindDII, kRavelKindDDB, kRavelKindDsmccOther, kRavelKindStreamEvents})
        kinds_.push_back(k);
      continue;
    }
    bool known = false;
    for (int kind = 0; kind < kRavelKindCount; ++kind) {
      if (word == kKindWords[kind]) {
        kinds_.push_back(static_cast<TableKind>(kind));
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

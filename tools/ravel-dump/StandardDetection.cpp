#include "StandardDetection.h"

#include <algorithm>
#include <cstdio>
#include <vector>

#include "Ravel_Cfg.h"

namespace ravel_dump {
namespace {

// Network ids ARIB assigns to terrestrial broadcasters.
const int kAribTerrestrialFirst = 0x7880;
const int kAribTerrestrialLast = 0x7FE8;

struct Signs {
  std::vector<std::string> japan;
  std::vector<std::string> brazil;

  void Add(std::vector<std::string>& signs, const std::string& sign) {
    if (std::find(signs.begin(), signs.end(), sign) == signs.end()) signs.push_back(sign);
  }
  // A country or language code of either standard.
  void AddCode(const std::string& what, const std::string& code) {
    if (code == "JPN" || code == "jpn") Add(japan, what + " " + code);
    if (code == "BRA" || code == "por") Add(brazil, what + " " + code);
  }
  void AddNetworkId(const char* what, int id) {
    if (id < kAribTerrestrialFirst || id > kAribTerrestrialLast) return;
    char sign[80];
    std::snprintf(sign, sizeof sign, "%s 0x%04X in the ARIB terrestrial range", what, id);
    Add(japan, sign);
  }
  // ARIB 8-unit code designates and shifts its character sets with escape
  // sequences, locking shifts (LS0, LS1) and single shifts (SS2, SS3): bytes a
  // text in ISO/IEC 8859-15 never holds.
  void AddText(const std::string& text) {
    if (text.find_first_of("\x1b\x0e\x0f\x19\x1d") != std::string::npos) Add(japan, "texts in ARIB 8-unit code");
  }
  void AddEvent(const EventSummary& event) {
    if (!event.valid) return;
    AddCode("event language", event.language);
    AddText(event.name);
    AddText(event.text);
    for (const Rating& rating : event.ratings) AddCode("parental rating country", rating.country);
  }
};

std::string Joined(const std::vector<std::string>& signs) {
  std::string text;
  for (const std::string& sign : signs) text += (text.empty() ? "" : "; ") + sign;
  return text;
}

}  // namespace

StandardChoice DetectStandard(const Summary& summary) {
  Signs signs;
  if (summary.network.valid) {
    signs.AddNetworkId("NIT network id", summary.network.id);
    signs.AddText(summary.network.name);
    for (const TransportStreamSummary& ts : summary.network.streams) signs.AddText(ts.name);
  }
  for (const ServiceSummary& service : summary.services) {
    signs.AddText(service.name);
    signs.AddText(service.provider);
    signs.AddEvent(service.present);
    signs.AddEvent(service.following);
  }
  for (const LocalOffset& offset : summary.time.offsets) signs.AddCode("local time offset country", offset.country);

  StandardChoice choice;
  if (signs.japan.size() > signs.brazil.size()) {
    choice.standard = RAVEL_STANDARD_JAPAN;
    choice.reason = Joined(signs.japan);
  } else {
    choice.standard = RAVEL_STANDARD_BRAZIL;
    choice.reason = signs.brazil.empty() ? "no sign of either standard: the library's default" : Joined(signs.brazil);
  }
  return choice;
}

StandardChoice GivenStandard(int standard) {
  StandardChoice choice;
  choice.standard = standard;
  choice.reason = "--standard";
  return choice;
}

const char* StandardName(int standard) { return standard == RAVEL_STANDARD_JAPAN ? "japan" : "brazil"; }

}  // namespace ravel_dump

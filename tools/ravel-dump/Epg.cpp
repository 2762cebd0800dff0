#include "Epg.h"

#include <algorithm>
#include <map>
#include <set>
#include <tuple>

#include "SectionBytes.h"

namespace ravel_dump {
namespace {

const std::size_t kEitHeaderSize = 14;
const std::size_t kCrcSize = 4;
const long kMjdOfUnixEpoch = 40587;

int Bcd(uint8_t byte) { return (byte >> 4) * 10 + (byte & 0x0F); }

// Days since 1970-01-01 of a civil date, and back (proleptic Gregorian).
long DaysFromCivil(int year, int month, int day) {
  year -= month <= 2;
  const long era = (year >= 0 ? year : year - 399) / 400;
  const long yearOfEra = year - era * 400;
  const long dayOfYear = (153 * (month + (month > 2 ? -3 : 9)) + 2) / 5 + day - 1;
  const long dayOfEra = yearOfEra * 365 + yearOfEra / 4 - yearOfEra / 100 + dayOfYear;
  return era * 146097 + dayOfEra - 719468;
}

DateTime FromDays(long days, long secondOfDay) {
  days += secondOfDay / 86400;
  secondOfDay %= 86400;
  days += 719468;
  const long era = (days >= 0 ? days : days - 146096) / 146097;
  const long dayOfEra = days - era * 146097;
  const long yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36524 - dayOfEra / 146096) / 365;
  const long dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
  const long monthIndex = (5 * dayOfYear + 2) / 153;
  DateTime t;
  t.valid = true;
  t.day = static_cast<int>(dayOfYear - (153 * monthIndex + 2) / 5 + 1);
  t.month = static_cast<int>(monthIndex < 10 ? monthIndex + 3 : monthIndex - 9);
  t.year = static_cast<int>(yearOfEra + era * 400 + (t.month <= 2));
  t.hour = static_cast<int>(secondOfDay / 3600);
  t.minute = static_cast<int>(secondOfDay / 60 % 60);
  t.second = static_cast<int>(secondOfDay % 60);
  return t;
}

}  // namespace

DateTime BroadcastDateTime(const uint8_t* p) {
  if (p[0] == 0xFF && p[1] == 0xFF && p[2] == 0xFF && p[3] == 0xFF && p[4] == 0xFF) return DateTime();
  const long mjd = (p[0] << 8) | p[1];
  return FromDays(mjd - kMjdOfUnixEpoch, Bcd(p[2]) * 3600L + Bcd(p[3]) * 60L + Bcd(p[4]));
}

namespace {

std::string Bytes(const uint8_t* p, std::size_t n) { return std::string(reinterpret_cast<const char*>(p), n); }

// Rating byte as the country's standard reads it: ABNT NBR 15603 in Brazil
// (the age in the low nibble), elsewhere (ARIB, DVB) minimum age = rating + 3.
std::string RatingLabel(const std::string& country, int raw) {
  if (country == "BRA" || country == "bra") {
    static const char* const kAges[] = {"", "L", "10", "12", "14", "16", "18"};
    const int age = raw & 0x0F;
    return age < 7 ? kAges[age] : "";
  }
  return raw >= 0x01 && raw <= 0x0F ? std::to_string(raw + 3) : std::string();
}

const char* GenreName(int level1, bool brazil) {
  static const char* const kBrazil[16] = {
      "News", "Sports", "Education", "Soap opera", "Mini-series", "Series", "Variety", "Reality show",
      "Information", "Comedy", "Children", "Erotic", "Movie", "Raffle, sales, awards", "Debate, interview",
      "Other"};
  static const char* const kJapan[16] = {
      "News", "Sports", "Information", "Drama", "Music", "Variety", "Movie", "Animation",
      "Documentary", "Theatre", "Hobby, education", "Welfare", "", "", "Extension", "Other"};
  return (brazil ? kBrazil : kJapan)[level1 & 0x0F];
}

struct ExtendedPart {
  int number = 0;
  std::vector<std::pair<std::string, std::string>> items;
  std::string text;
};

// One extended event descriptor's body; false when its lengths overrun it.
bool ReadExtended(const uint8_t* p, std::size_t n, ExtendedPart& part) {
  if (n < 5) return false;
  part.number = p[0] >> 4;
  std::size_t itemsEnd = 5 + p[4];
  if (itemsEnd > n) return false;
  std::size_t at = 5;
  while (at < itemsEnd) {
    std::size_t descriptionLength = p[at];
    if (at + 1 + descriptionLength + 1 > itemsEnd) return false;
    std::string description = Bytes(p + at + 1, descriptionLength);
    at += 1 + descriptionLength;
    std::size_t itemLength = p[at];
    if (at + 1 + itemLength > itemsEnd) return false;
    part.items.push_back({description, Bytes(p + at + 1, itemLength)});
    at += 1 + itemLength;
  }
  if (itemsEnd >= n || itemsEnd + 1 + p[itemsEnd] > n) return false;
  part.text = Bytes(p + itemsEnd + 1, p[itemsEnd]);
  return true;
}

void JoinExtended(std::vector<ExtendedPart>& parts, EpgEvent& event) {
  std::stable_sort(parts.begin(), parts.end(),
                   [](const ExtendedPart& a, const ExtendedPart& b) { return a.number < b.number; });
  for (const ExtendedPart& part : parts) {
    for (const auto& item : part.items) {
      if (item.first.empty() && !event.items.empty()) {
        event.items.back().second += item.second;
      } else {
        event.items.push_back(item);
      }
    }
    event.extendedText += part.text;
  }
}

void ReadDescriptors(const uint8_t* p, std::size_t n, bool brazil, EpgEvent& event) {
  std::vector<ExtendedPart> extended;
  EachDescriptor(p, n, [&](uint8_t tag, const uint8_t* body, std::size_t length) {
    if (tag == 0x4D && length >= 5) {  // short event
      std::size_t nameLength = body[3];
      if (4 + nameLength + 1 > length || 5 + nameLength + body[4 + nameLength] > length) return;
      event.language = Bytes(body, 3);
      event.name = Bytes(body + 4, nameLength);
      event.text = Bytes(body + 5 + nameLength, body[4 + nameLength]);
    } else if (tag == 0x4E) {
      ExtendedPart part;
      if (ReadExtended(body, length, part)) extended.push_back(part);
    } else if (tag == 0x55) {  // parental rating
      for (std::size_t r = 0; r + 4 <= length; r += 4) {
        EpgRating rating;
        rating.country = Bytes(body + r, 3);
        rating.raw = body[r + 3];
        rating.label = RatingLabel(rating.country, rating.raw);
        event.ratings.push_back(rating);
      }
    } else if (tag == 0x54) {  // content
      for (std::size_t c = 0; c + 2 <= length; c += 2) {
        EpgGenre genre;
        genre.level1 = body[c] >> 4;
        genre.level2 = body[c] & 0x0F;
        genre.name = GenreName(genre.level1, brazil);
        event.genres.push_back(genre);
      }
    }
  });
  JoinExtended(extended, event);
}

// The events of one EIT section whose loops fit it.
void ReadSection(const uint8_t* s, std::size_t size, bool brazil, std::vector<EpgEvent>& events) {
  if (size < kEitHeaderSize + kCrcSize) return;
  const std::size_t end = size - kCrcSize;
  std::size_t at = kEitHeaderSize;
  while (at + 12 <= end) {
    const uint8_t* e = s + at;
    const std::size_t loopLength = ((e[10] & 0x0F) << 8) | e[11];
    if (at + 12 + loopLength > end) return;
    EpgEvent event;
    event.tableId = s[0];
    event.serviceId = (s[3] << 8) | s[4];
    event.transportStreamId = (s[8] << 8) | s[9];
    event.originalNetworkId = (s[10] << 8) | s[11];
    event.eventId = (e[0] << 8) | e[1];
    event.start = BroadcastDateTime(e + 2);
    event.duration.hours = Bcd(e[7]);
    event.duration.minutes = Bcd(e[8]);
    event.duration.seconds = Bcd(e[9]);
    event.runningStatus = e[10] >> 5;
    event.freeCaMode = (e[10] & 0x10) != 0;
    ReadDescriptors(e + 12, loopLength, brazil, event);
    events.push_back(event);
    at += 12 + loopLength;
  }
}

bool IsEit(uint8_t tableId) { return tableId >= 0x4E && tableId <= 0x6F; }

}  // namespace

DateTime EventEnd(const EpgEvent& event) {
  const DateTime& s = event.start;
  if (!s.valid) return DateTime();
  const long seconds = s.hour * 3600L + s.minute * 60L + s.second + event.duration.hours * 3600L +
                       event.duration.minutes * 60L + event.duration.seconds;
  return FromDays(DaysFromCivil(s.year, s.month, s.day), seconds);
}

std::vector<EpgEvent> BuildEpg(const TableRegistry& registry, bool brazil) {
  // The latest version of each sub-table: table_id, service, stream, network.
  typedef std::tuple<int, int, int, int> SubTable;
  std::map<SubTable, const TableEntry*> latest = LatestTables<SubTable>(registry, [](const TableEntry& t, SubTable& key) {
    const StoredSection& first = t.sections.begin()->second;
    if (!IsEit(t.tableId) || first.Size() < kEitHeaderSize) return false;
    const uint8_t* s = first.Bytes();
    key = SubTable(t.tableId, t.extension, (s[8] << 8) | s[9], (s[10] << 8) | s[11]);
    return true;
  });
  // Present/following first (the map orders by table_id): an event also in a
  // schedule is kept as present/following gives it.
  std::vector<EpgEvent> events;
  std::set<std::tuple<int, int, int, int>> seen;
  for (const auto& kv : latest) {
    for (const auto& section : kv.second->sections) {
      std::vector<EpgEvent> read;
      ReadSection(section.second.Bytes(), section.second.Size(), brazil, read);
      for (EpgEvent& event : read) {
        if (seen.insert(std::make_tuple(event.originalNetworkId, event.transportStreamId, event.serviceId,
                                        event.eventId)).second) {
          events.push_back(std::move(event));
        }
      }
    }
  }
  std::stable_sort(events.begin(), events.end(), [](const EpgEvent& a, const EpgEvent& b) {
    auto when = [](const EpgEvent& e) {
      const DateTime& t = e.start;
      return std::make_tuple(!t.valid, t.year, t.month, t.day, t.hour, t.minute, t.second, e.eventId);
    };
    return std::make_tuple(a.originalNetworkId, a.transportStreamId, a.serviceId) <
               std::make_tuple(b.originalNetworkId, b.transportStreamId, b.serviceId) ||
           (std::make_tuple(a.originalNetworkId, a.transportStreamId, a.serviceId) ==
                std::make_tuple(b.originalNetworkId, b.transportStreamId, b.serviceId) &&
            when(a) < when(b));
  });
  return events;
}

}  // namespace ravel_dump

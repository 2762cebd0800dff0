#include "TimeBase.h"

#include <cstdio>
#include <cstdlib>

#include "Ravel_Cfg.h"

namespace ravel_dump {

int UtcOffsetMinutesOf(int standard) { return standard == RAVEL_STANDARD_JAPAN ? 9 * 60 : -3 * 60; }

std::string UtcOffsetText(int utcOffsetMinutes) {
  char text[16];
  int minutes = std::abs(utcOffsetMinutes);
  std::snprintf(text, sizeof text, "%c%02d:%02d", utcOffsetMinutes < 0 ? '-' : '+', minutes / 60, minutes % 60);
  return text;
}

std::string Iso8601(const DateTime& time, int utcOffsetMinutes) {
  if (!time.valid) return std::string();
  char text[48];
  std::snprintf(text, sizeof text, "%04d-%02d-%02dT%02d:%02d:%02d", time.year, time.month, time.day, time.hour,
                time.minute, time.second);
  return text + UtcOffsetText(utcOffsetMinutes);
}

}  // namespace ravel_dump

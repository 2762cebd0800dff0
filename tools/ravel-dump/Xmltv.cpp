#include "Xmltv.h"

#include <cstdio>

#include "BroadcastText.h"
#include "Epg.h"

namespace ravel_dump {
namespace {

std::string Escaped(const std::string& text) {
  std::string out;
  for (char c : text) {
    switch (c) {
      case '&': out += "&amp;"; break;
      case '<': out += "&lt;"; break;
      case '>': out += "&gt;"; break;
      case '"': out += "&quot;"; break;
      default: out += c;
    }
  }
  return out;
}

// XMLTV's channel ids read like domain names.
std::string ChannelId(const EpgEvent& e) {
  char id[64];
  std::snprintf(id, sizeof id, "%04x.%04x.%04x.ravel-dump", e.serviceId, e.transportStreamId, e.originalNetworkId);
  return id;
}

// "20190122123500 -0300": the broadcast's time with its time base.
std::string XmltvTime(const DateTime& t, int utcOffsetMinutes) {
  const int magnitude = utcOffsetMinutes < 0 ? -utcOffsetMinutes : utcOffsetMinutes;
  char text[32];
  std::snprintf(text, sizeof text, "%04d%02d%02d%02d%02d%02d %c%02d%02d", t.year, t.month, t.day, t.hour, t.minute,
                t.second, utcOffsetMinutes < 0 ? '-' : '+', magnitude / 60, magnitude % 60);
  return text;
}

bool SameService(const EpgEvent& a, const EpgEvent& b) {
  return a.originalNetworkId == b.originalNetworkId && a.transportStreamId == b.transportStreamId &&
         a.serviceId == b.serviceId;
}

std::string LanguageAttribute(const std::string& language) {
  std::string code;
  for (char c : language) {
    if ((c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z')) code += static_cast<char>(c | 0x20);
  }
  return code.size() == 3 ? " lang=\"" + code + "\"" : std::string();
}

}  // namespace

std::string ServiceNameOf(const Summary& summary, int originalNetworkId, int transportStreamId, int serviceId) {
  for (const SdtService& s : summary.allServices) {
    if (s.originalNetworkId == originalNetworkId && s.transportStreamId == transportStreamId && s.id == serviceId) {
      return s.name;
    }
  }
  return std::string();
}

std::string XmltvDocument(const Summary& summary) {
  auto text = [&](const std::string& bytes) { return Escaped(DecodeBroadcastText(bytes, summary.textCoding)); };
  std::string xml =
      "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
      "<!DOCTYPE tv SYSTEM \"xmltv.dtd\">\n"
      "<tv generator-info-name=\"ravel-dump\">\n";
  const std::vector<EpgEvent>& events = summary.epg;
  for (std::size_t i = 0; i < events.size(); ++i) {
    if (i > 0 && SameService(events[i - 1], events[i])) continue;
    const EpgEvent& e = events[i];
    std::string name = text(ServiceNameOf(summary, e.originalNetworkId, e.transportStreamId, e.serviceId));
    if (name.empty()) {
      char fallback[32];
      std::snprintf(fallback, sizeof fallback, "Service 0x%04x", e.serviceId);
      name = fallback;
    }
    xml += "  <channel id=\"" + ChannelId(e) + "\">\n    <display-name>" + name + "</display-name>\n  </channel>\n";
  }
  for (const EpgEvent& e : events) {
    if (!e.start.valid) continue;  // a programme needs a start
    const std::string lang = LanguageAttribute(e.language);
    std::string title = text(e.name);
    if (title.empty()) {
      char fallback[32];
      std::snprintf(fallback, sizeof fallback, "Event 0x%04x", e.eventId);
      title = fallback;
    }
    xml += "  <programme start=\"" + XmltvTime(e.start, summary.utcOffsetMinutes) + "\" stop=\"" +
           XmltvTime(EventEnd(e), summary.utcOffsetMinutes) + "\" channel=\"" + ChannelId(e) + "\">\n";
    xml += "    <title" + lang + ">" + title + "</title>\n";
    std::string description = text(e.text);
    std::string extended = text(e.extendedText);
    for (const auto& item : e.items) {
      if (!extended.empty()) extended += "\n";
      extended += text(item.first) + ": " + text(item.second);
    }
    if (!description.empty()) xml += "    <desc" + lang + ">" + description + "</desc>\n";
    if (!extended.empty()) xml += "    <desc" + lang + ">" + extended + "</desc>\n";
    for (const EpgGenre& genre : e.genres) {
      if (!genre.name.empty()) xml += "    <category lang=\"en\">" + Escaped(genre.name) + "</category>\n";
    }
    for (const EpgRating& rating : e.ratings) {
      if (rating.label.empty()) continue;
      xml += "    <rating system=\"" + Escaped(DecodeBroadcastText(rating.country, TextCoding::kAsBroadcast)) +
             "\">\n      <value>" + rating.label + "</value>\n    </rating>\n";
    }
    xml += "  </programme>\n";
  }
  xml += "</tv>\n";
  return xml;
}

bool WriteXmltv(const std::string& path, const Summary& summary, std::string& error) {
  const std::string document = XmltvDocument(summary);
  std::FILE* file = std::fopen(path.c_str(), "wb");
  bool written = file != nullptr && std::fwrite(document.data(), 1, document.size(), file) == document.size();
  if (file != nullptr && std::fclose(file) != 0) written = false;
  if (!written) error = "cannot write the XMLTV guide to " + path;
  return written;
}

}  // namespace ravel_dump

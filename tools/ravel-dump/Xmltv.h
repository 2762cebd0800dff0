// The programme guide as XMLTV (the XMLTV project's xmltv.dtd), the file
// media centres import: one channel per service with events, then its
// programmes with titles, descriptions, genres and ratings.
#ifndef RAVEL_DUMP_XMLTV_H
#define RAVEL_DUMP_XMLTV_H

#include <string>

#include "Summary.h"

namespace ravel_dump {

std::string XmltvDocument(const Summary& summary);
// Writes the document to `path`; false with a one-line `error` when it cannot.
bool WriteXmltv(const std::string& path, const Summary& summary, std::string& error);

// The service's name from the SDT that describes it, or "" when none did.
std::string ServiceNameOf(const Summary& summary, int originalNetworkId, int transportStreamId, int serviceId);

}  // namespace ravel_dump

#endif

// The sample capture of a Brazilian one-segment service, as the packets a
// receiver's demultiplexer sees on layer A.
#ifndef RAVEL_TOOLS_SAMPLESTREAM_H
#define RAVEL_TOOLS_SAMPLESTREAM_H

#include <string>

#include "StreamBuilder.h"

namespace sample {

// Builds the whole capture (188-byte packets). Returns false with `error` set
// when a section could not be carried the way the receiver expects.
bool BuildOneSegCapture(Bytes& capture, std::string& error);

}  // namespace sample

#endif

// Access to the real broadcast captures kept beside the repository. Tests that
// need them skip with a message when they are absent.
#ifndef RAVEL_TESTS_CAPTURES_H
#define RAVEL_TESTS_CAPTURES_H

#include <string>
#include <vector>

#include "StreamBuilder.h"

namespace captures {

// Full path of a capture file, or "" when the shared folder is not there.
std::string Path(const std::string& name);
bool Load(const std::string& name, Bytes& contents);
// Splits a file of concatenated raw sections (each 3 + section_length bytes).
std::vector<Bytes> SplitSections(const Bytes& contents);
// The 188-byte packets of a TS file whose PID is `pid`.
std::vector<Bytes> PacketsOfPid(const Bytes& stream, unsigned int pid);
// The sections of one PID, reassembled by the library's own store as a receiver
// does (one store for the PID, a fresh output record per packet).
std::vector<Bytes> SectionsOfPid(const Bytes& stream, unsigned int pid);

}  // namespace captures

// Skips the current test when the capture is missing.
#define RAVEL_LOAD_CAPTURE_OR_SKIP(name, bytes)                                                   \
  do {                                                                                            \
    if (!captures::Load((name), (bytes))) GTEST_SKIP() << "shared capture " << (name) << " absent"; \
  } while (0)

#endif

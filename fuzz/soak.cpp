// Streams mutated from a seed corpus, with every section's CRC_32 recomputed,
// fed to a fuzz target without libFuzzer and without sanitizers: the check that
// a Release build of the library survives bytes from the air at full speed.
//
//   <target>_soak SEEDS_DIR [STREAMS] [RANDOM_SEED]     default: 10000000 streams, seed 1
//
// Each stream is a seed with 1 to 16 mutations (bit flips, bytes and 16-bit
// lengths set to edge values, pieces copied, moved, inserted or cut, packets
// spliced from another seed), parsed with the traces off. A fatal signal writes
// the stream being parsed to soak-crash-<stream> and ends the program with that
// signal. The same RANDOM_SEED replays the same streams.
#include <dirent.h>
#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_PGL.h"
#include "StreamRepair.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

typedef std::vector<uint8_t> Bytes;

const size_t kMaxStreamSize = 256 * fuzz::kPacketSize;
const int kMaxMutations = 16;

// The stream being parsed, for the fatal-signal handler.
const uint8_t* gCurrent = 0;
size_t gCurrentSize = 0;
unsigned long long gCurrentIndex = 0;

void WriteDecimal(char* out, unsigned long long value) {
  char digits[24];
  int n = 0;
  do {
    digits[n++] = static_cast<char>('0' + value % 10);
    value /= 10;
  } while (value != 0);
  while (n > 0) *out++ = digits[--n];
  *out = 0;
}

// Async-signal-safe: no allocation, no stdio.
void OnFatalSignal(int signal) {
  char name[64] = "soak-crash-";
  WriteDecimal(name + 11, gCurrentIndex);
  int fd = open(name, O_WRONLY | O_CREAT | O_TRUNC, 0644);
  if (fd >= 0) {
    ssize_t written = write(fd, gCurrent, gCurrentSize);
    (void)written;
    close(fd);
  }
  const char message[] = "soak: fatal signal, stream written to ";
  ssize_t said = write(2, message, sizeof(message) - 1);
  said = write(2, name, strlen(name));
  said = write(2, "\n", 1);
  (void)said;
  ::signal(signal, SIG_DFL);
  raise(signal);
}

std::vector<Bytes> ReadSeeds(const std::string& folder) {
  std::vector<Bytes> seeds;
  DIR* dir = opendir(folder.c_str());
  for (dirent* entry = dir ? readdir(dir) : 0; entry != 0; entry = readdir(dir)) {
    if (entry->d_name[0] == '.') continue;
    std::ifstream in((folder + "/" + entry->d_name).c_str(), std::ios::binary);
    Bytes bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (bytes.size() >= fuzz::kPacketSize) seeds.push_back(bytes);
  }
  if (dir) closedir(dir);
  return seeds;
}

class Mutator {
 public:
  Mutator(const std::vector<Bytes>& seeds, unsigned long long randomSeed) : rSeeds(seeds), rRandom(randomSeed) {}

  Bytes Next() {
    Bytes stream = rSeeds[Below(rSeeds.size())];
    const int count = 1 + static_cast<int>(Below(kMaxMutations));
    for (int i = 0; i < count && !stream.empty(); ++i) Mutate(stream);
    if (stream.size() > kMaxStreamSize) stream.resize(kMaxStreamSize);
    fuzz::RepairSectionCrcs(stream.data(), stream.size());
    return stream;
  }

 private:
  size_t Below(size_t limit) { return limit == 0 ? 0 : static_cast<size_t>(rRandom() % limit); }

  void Mutate(Bytes& s) {
    static const uint8_t kEdgeBytes[] = {0x00, 0x01, 0x7F, 0x80, 0xFE, 0xFF};
    static const uint16_t kEdgeLengths[] = {0x0000, 0x0001, 0x00FF, 0x0100, 0x0FFF, 0x7FFF, 0x8000, 0xFFFF};
    const size_t at = Below(s.size());
    switch (Below(8)) {
      case 0: s[at] ^= static_cast<uint8_t>(1u << Below(8)); break;
      case 1: s[at] = static_cast<uint8_t>(rRandom()); break;
      case 2: s[at] = kEdgeBytes[Below(sizeof(kEdgeBytes))]; break;
      case 3:
        if (at + 1 < s.size()) {
          // A 12-bit length keeps the 4 bits above it half of the time.
          uint16_t value = Below(2) ? kEdgeLengths[Below(8)] : static_cast<uint16_t>(Below(0x1000));
          if (Below(2)) value = static_cast<uint16_t>((s[at] & 0xF0) << 8 | (value & 0x0FFF));
          s[at] = static_cast<uint8_t>(value >> 8);
          s[at + 1] = static_cast<uint8_t>(value);
        }
        break;
      case 4: {  // copy a piece over another place
        const size_t from = Below(s.size());
        const size_t length = 1 + Below(64);
        for (size_t i = 0; i < length && from + i < s.size() && at + i < s.size(); ++i) s[at + i] = s[from + i];
        break;
      }
      case 5: {  // cut a piece: the packets after it lose their alignment
        const size_t length = 1 + Below(32);
        const size_t end = at + length < s.size() ? at + length : s.size();
        s.erase(s.begin() + static_cast<long>(at), s.begin() + static_cast<long>(end));
        break;
      }
      case 6: {  // insert random bytes
        const size_t length = 1 + Below(32);
        Bytes piece(length);
        for (size_t i = 0; i < length; ++i) piece[i] = static_cast<uint8_t>(rRandom());
        s.insert(s.begin() + static_cast<long>(at), piece.begin(), piece.end());
        break;
      }
      default: {  // splice a packet of another seed in place of one of this stream
        const Bytes& other = rSeeds[Below(rSeeds.size())];
        const size_t packets = s.size() / fuzz::kPacketSize;
        const size_t otherPackets = other.size() / fuzz::kPacketSize;
        if (packets == 0 || otherPackets == 0) break;
        const size_t to = Below(packets) * fuzz::kPacketSize;
        const size_t from = Below(otherPackets) * fuzz::kPacketSize;
        std::copy(other.begin() + static_cast<long>(from), other.begin() + static_cast<long>(from + fuzz::kPacketSize),
                  s.begin() + static_cast<long>(to));
        break;
      }
    }
  }

  const std::vector<Bytes>& rSeeds;
  std::mt19937_64 rRandom;
};

}  // namespace

int main(int argc, char** argv) {
  if (argc < 2) {
    std::fprintf(stderr, "usage: %s SEEDS_DIR [STREAMS] [RANDOM_SEED]\n", argv[0]);
    return 2;
  }
  const unsigned long long streams = argc > 2 ? std::strtoull(argv[2], 0, 10) : 10000000ULL;
  const unsigned long long randomSeed = argc > 3 ? std::strtoull(argv[3], 0, 10) : 1ULL;
  const std::vector<Bytes> seeds = ReadSeeds(argv[1]);
  if (seeds.empty()) {
    std::fprintf(stderr, "no seeds of a whole packet or more in %s\n", argv[1]);
    return 2;
  }
  // Traces off, as in a receiver in the field: nothing is formatted (the fuzz
  // run formats every message), which halves the time of a stream.
  fuzz::SilenceTraces();
  RavelPGL_SetTraceHook(0, 0);
  RavelPGL_SetTraceMask(0);
  const int fatal[] = {SIGSEGV, SIGBUS, SIGABRT, SIGFPE, SIGILL};
  for (int s : fatal) signal(s, OnFatalSignal);

  Mutator mutator(seeds, randomSeed);
  const std::chrono::steady_clock::time_point start = std::chrono::steady_clock::now();
  unsigned long long bytes = 0;
  for (gCurrentIndex = 0; gCurrentIndex < streams; ++gCurrentIndex) {
    Bytes stream = mutator.Next();
    // Exactly the stream's size on the heap, as libFuzzer hands it over.
    uint8_t* copy = new uint8_t[stream.empty() ? 1 : stream.size()];
    std::copy(stream.begin(), stream.end(), copy);
    gCurrent = copy;
    gCurrentSize = stream.size();
    LLVMFuzzerTestOneInput(copy, stream.size());
    delete[] copy;
    bytes += stream.size();
    if ((gCurrentIndex + 1) % 1000000 == 0) {
      const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
      std::fprintf(stderr, "%llu streams, %.0f s\n", gCurrentIndex + 1, seconds);
    }
  }
  const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
  std::printf("%llu streams (%.1f MB) from %zu seeds, random seed %llu, %.1f s, 0 crashes\n", streams, bytes / 1e6,
              seeds.size(), randomSeed, seconds);
  return 0;
}

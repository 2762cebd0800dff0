// A progress bar on stderr while a large capture is read in a terminal session.
#ifndef RAVEL_DUMP_PROGRESS_H
#define RAVEL_DUMP_PROGRESS_H

#include <chrono>
#include <cstdint>

namespace ravel_dump {

class Progress {
 public:
  // Shown only when `wanted`, stderr is a terminal and `total` (the input's
  // size, -1 when unknown) is large enough for reading to take a while.
  Progress(bool wanted, long long total);
  ~Progress();

  // Cheap to call for every packet: redraws a few times a second at most.
  void Update(uint64_t offset) {
    if (enabled_ && ++calls_ % 4096 == 0) Draw(offset);
  }
  // Clears the bar.
  void Finish();

 private:
  void Draw(uint64_t offset);

  bool enabled_;
  bool drawn_;
  long long total_;
  uint64_t calls_;
  std::chrono::steady_clock::time_point last_;
};

}  // namespace ravel_dump

#endif

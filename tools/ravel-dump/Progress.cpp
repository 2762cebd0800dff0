#include "Progress.h"

#include <cstdio>

#include <unistd.h>

namespace ravel_dump {
namespace {
const long long kLargeInput = 32ll << 20;
const int kBarWidth = 40;
}  // namespace

Progress::Progress(bool wanted, long long total)
    : enabled_(wanted && total >= kLargeInput && isatty(STDERR_FILENO) == 1),
      drawn_(false),
      total_(total),
      calls_(0),
      last_(std::chrono::steady_clock::now()) {}

Progress::~Progress() { Finish(); }

void Progress::Draw(uint64_t offset) {
  auto now = std::chrono::steady_clock::now();
  if (drawn_ && now - last_ < std::chrono::milliseconds(100)) return;
  last_ = now;
  drawn_ = true;
  double fraction = total_ > 0 ? static_cast<double>(offset) / static_cast<double>(total_) : 0.0;
  if (fraction > 1.0) fraction = 1.0;
  int filled = static_cast<int>(fraction * kBarWidth);
  char bar[kBarWidth + 1];
  for (int i = 0; i < kBarWidth; ++i) bar[i] = i < filled ? '#' : '.';
  bar[kBarWidth] = '\0';
  std::fprintf(stderr, "\r[%s] %3d%%  %.1f of %.1f MiB", bar, static_cast<int>(fraction * 100.0),
               static_cast<double>(offset) / 1048576.0, static_cast<double>(total_) / 1048576.0);
  std::fflush(stderr);
}

void Progress::Finish() {
  if (drawn_) {
    std::fputs("\r\033[K", stderr);
    std::fflush(stderr);
    drawn_ = false;
  }
  enabled_ = false;
}

}  // namespace ravel_dump

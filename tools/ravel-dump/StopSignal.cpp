#include "StopSignal.h"

#include <poll.h>
#include <signal.h>

#include <cerrno>

namespace ravel_dump {
namespace {

volatile sig_atomic_t stopRequested = 0;

// How long a wait for input goes before it looks at the stop request again:
// covers a signal that arrives just before the wait starts.
const int kStopCheckMs = 200;

void OnStopSignal(int) { stopRequested = 1; }

}  // namespace

void InstallStopSignals() {
  struct sigaction action;
  action.sa_handler = OnStopSignal;
  sigemptyset(&action.sa_mask);
  action.sa_flags = SA_RESETHAND;
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
}

bool StopRequested() { return stopRequested != 0; }

bool WaitReadable(int fd) {
  struct pollfd waited;
  waited.fd = fd;
  waited.events = POLLIN;
  for (;;) {
    if (StopRequested()) return false;
    waited.revents = 0;
    const int ready = poll(&waited, 1, kStopCheckMs);
    if (ready > 0) return true;  // readable, at its end, or failed: read() tells which
    if (ready < 0 && errno != EINTR) return true;
  }
}

}  // namespace ravel_dump

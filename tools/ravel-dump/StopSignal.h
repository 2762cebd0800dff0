// SIGINT and SIGTERM end a run the way the end of the input does: the reading
// loop sees the request, stops reading, and everything read so far is
// summarised and reported with the exit status of a complete run. A second
// signal ends the process at once, as without ravel-dump's handler.
#ifndef RAVEL_DUMP_STOPSIGNAL_H
#define RAVEL_DUMP_STOPSIGNAL_H

namespace ravel_dump {

// Installs the handlers. A blocking read is interrupted by the signal (no
// SA_RESTART), so a quiet live input stops as promptly as a busy one.
void InstallStopSignals();
// Whether SIGINT or SIGTERM has arrived.
bool StopRequested();

// Waits until `fd` has bytes to read (or its end), checking for a stop request
// a few times a second. False when the run is to stop.
bool WaitReadable(int fd);

}  // namespace ravel_dump

#endif

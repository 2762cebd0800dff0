// What happens in a capture, told as it happens, for people and programs that
// follow a live input: a table when it is first complete and again, marked as
// a change, each time its version or contents change; a carousel module when
// it completes; the time a TDT or TOT gives; each problem met. Dumps go out
// as the library's own Show() (the default output), events as one JSON object
// a line (--jsonl); each is flushed at once.
#ifndef RAVEL_DUMP_LIVEEVENTS_H
#define RAVEL_DUMP_LIVEEVENTS_H

#include <cstdint>
#include <cstdio>
#include <functional>
#include <string>
#include <unordered_map>

#include "Carousel.h"
#include "TableKind.h"
#include "TableRegistry.h"
#include "TraceOutput.h"

namespace ravel_dump {

enum class LiveFormat { kDump, kJsonLines };

class LiveEvents : public CarouselListener {
 public:
  LiveEvents(LiveFormat format, const TableFilter& filter, TraceOutput& trace, std::FILE* out);

  // Carousel events go on to `next` (the object carousels) after being told.
  void ForwardCarouselTo(CarouselListener* next) { next_ = next; }
  // Called before a table is dumped: the texts' coding follows the standard
  // the tables read so far show.
  void BeforeDump(std::function<void()> settle) { settle_ = settle; }

  // A section of `table` has just arrived, new or a repeat.
  void OnTableSection(const TableEntry& table);
  void OnProblem(const std::string& line);
  // The input has ended: tables that never completed are dumped as they are.
  void End(const TableRegistry& registry);

  void OnServiceGateway(int pid, const std::vector<uint8_t>& ior) override;
  void OnModuleComplete(const CarouselCollector& collector, const ModuleRef& module) override;

 private:
  void Emit(const std::string& line);

  LiveFormat format_;
  const TableFilter& filter_;
  TraceOutput& trace_;
  std::FILE* out_;
  CarouselListener* next_ = nullptr;
  std::function<void()> settle_;
  // Per table identity, the serial number of the version last told.
  std::unordered_map<uint64_t, uint64_t> told_;
};

}  // namespace ravel_dump

#endif

// What the tool makes of a capture while it is read: each section from the
// demultiplexer (or from a file of raw sections) that is not a repeat is
// checked and parsed once by the library's safe entry, counted, kept in the
// table registry with its parsed object, and used at once where a receiver would use it:
// a PAT or a PMT names more section PIDs, DII and DDB messages feed the
// carousel collector, whose complete modules build the object carousels.
#ifndef RAVEL_DUMP_CAPTURE_H
#define RAVEL_DUMP_CAPTURE_H

#include <cstddef>
#include <cstdint>

#include "Carousel.h"
#include "Demux.h"
#include "LiveEvents.h"
#include "ObjectCarousel.h"
#include "Stats.h"
#include "TableRegistry.h"
#include "TraceOutput.h"

namespace ravel_dump {

class Capture : public SectionSink {
 public:
  // `trace` tells which descriptors the library skips as it parses.
  Capture(Stats& stats, TraceOutput& trace);

  // The demultiplexer of a transport stream; null for a file of sections.
  void SetDemux(Demux* demux) { demux_ = demux; }

  void OnSection(int pid, const uint8_t* section, std::size_t size) override;
  // Told of every section of a table as it arrives; carousel events pass
  // through it to the object carousels.
  void SetEvents(LiveEvents* events);

  const TableRegistry& Registry() const { return registry_; }
  const CarouselCollector& Carousel() const { return carousel_; }
  ObjectCarousels& Objects() { return objects_; }
  const ObjectCarousels& Objects() const { return objects_; }

 private:
  Stats& stats_;
  TraceOutput& trace_;
  Demux* demux_;
  LiveEvents* events_ = nullptr;
  TableRegistry registry_;
  CarouselCollector carousel_;
  ObjectCarousels objects_;
};

// What a receiver does with a section the library parsed when it first
// arrives: a PAT or a PMT names more section PIDs to `demux` (when there is
// one), a DII or a DDB goes to the carousel collector.
void UseOnArrival(int pid, TableKind kind, RavelCSafeSection& parsed, Demux* demux, CarouselCollector& carousel);

}  // namespace ravel_dump

#endif

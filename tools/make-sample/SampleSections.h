// The sections of the sample one-segment capture and the values they carry:
// one SBTVD channel ("Rede Exemplo", São Paulo, UHF 24) whose layer A holds the
// one-segment service 0xE778 with its Ginga application, data carousel and
// stream events. Identifiers follow ABNT NBR 15603 and ARIB practice for the
// partial-reception service (PMT on 0x1FC8, EIT on 0x0027).
#ifndef RAVEL_TOOLS_SAMPLESECTIONS_H
#define RAVEL_TOOLS_SAMPLESECTIONS_H

#include <cstdint>
#include <vector>

#include "StreamBuilder.h"

namespace sample {

// Network and services.
const uint16_t kNetworkId = 0x0640;
const uint16_t kOriginalNetworkId = 0x0640;
const uint16_t kTransportStreamId = 0x0640;
const uint16_t kFullSegServiceId = 0xE760;
const uint16_t kOneSegServiceId = 0xE778;  // service number bits 0x18: partial reception

// PIDs. The full-seg PMT is listed in the PAT but travels in layer B, which a
// one-segment receiver does not demodulate, so none of its packets are here.
const uint16_t kPidPat = 0x0000;
const uint16_t kPidNit = 0x0010;
const uint16_t kPidSdt = 0x0011;
const uint16_t kPidTime = 0x0014;  // TDT and TOT
const uint16_t kPidBit = 0x0024;
const uint16_t kPidOneSegEit = 0x0027;
const uint16_t kPidFullSegPmt = 0x01F0;
const uint16_t kPidOneSegPmt = 0x1FC8;
const uint16_t kPidVideo = 0x0181;  // also the PCR PID
const uint16_t kPidAudio = 0x0183;
const uint16_t kPidCaptions = 0x0187;
const uint16_t kPidAit = 0x0188;
const uint16_t kPidCarousel = 0x018A;
const uint16_t kPidStreamEvents = 0x018B;
const uint16_t kPidNull = 0x1FFF;

// Clocks: the first PCR base (90 kHz) and the step from one round of the
// multiplex to the next (100 ms).
const uint64_t kFirstPcrBase = 0x20000000u;
const uint64_t kPcrStep = 9000;

// Carousel.
const uint32_t kCarouselId = 0x00000001;
const uint32_t kDownloadId = 0x00000001;
const uint16_t kBlockSize = 1024;

struct CarouselModule {
  uint16_t id;
  uint8_t version;
  const char* type;
  const char* name;
  Bytes data;
};

// PSI/SI (SampleTables.cpp).
Bytes PatSection();
Bytes OneSegPmtSection();
Bytes NitSection();
Bytes SdtSection();
// section 0: present event, section 1: following event.
Bytes OneSegEitSection(uint8_t sectionNumber);
Bytes TdtSection();
Bytes TotSection();
Bytes BitSection();

// Interactivity (SampleInteractive.cpp).
Bytes AitSection();
std::vector<CarouselModule> CarouselModules();
Bytes DsiSection();
Bytes DiiSection(const std::vector<CarouselModule>& modules);
// Every DDB section of the module, block by block.
std::vector<Bytes> DdbSections(const CarouselModule& module);
Bytes StreamDescriptorSection();

}  // namespace sample

#endif

#include "Ravel_CObjectCarouselTransmissionFormat.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CObjectCarouselTransmissionFormat");

RavelCObjectCarouselTransmissionFormat::RavelCObjectCarouselTransmissionFormat()
    : iCarouselId(0), bOnDemandRetrievalFlag(0), bFileStorableFlag(0), bEventSectionFlag(0) {}

int RavelCObjectCarouselTransmissionFormat::ParseRawData(const unsigned char* raw) {
  *this = RavelCObjectCarouselTransmissionFormat();
  if (raw == 0) return kRavelErrInvalidArgument;
  iCarouselId = RavelRead32(raw);
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "CarouselId [0x%08x]\n", iCarouselId);
  bOnDemandRetrievalFlag = (raw[4] >> 7) & 0x01;  // oxxxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bOnDemandRetrievalFlag [%d]\n", bOnDemandRetrievalFlag);
  bFileStorableFlag = (raw[4] >> 6) & 0x01;  // xfxxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bFileStorableFlag [%d]\n", bFileStorableFlag);
  bEventSectionFlag = (raw[4] >> 5) & 0x01;  // xxexxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bEventSectionFlag [%d]\n", bEventSectionFlag);
  return kRavelOk;
}

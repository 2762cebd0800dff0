#include "Ravel_CObjectCarouselTransmissionFormat.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CObjectCarouselTransmissionFormat");

RavelCObjectCarouselTransmissionFormat::RavelCObjectCarouselTransmissionFormat() {}

int RavelCObjectCarouselTransmissionFormat::ParseRawData(const unsigned char* raw) {
  *this = RavelCObjectCarouselTransmissionFormat();
  if (raw == 0) return kRavelErrInvalidArgument;
  iCarouselId = RavelCReadWindow::Read32(raw);
  const unsigned char flags = RavelCReadWindow::Read8(raw + 4);
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "CarouselId [0x%08x]\n", iCarouselId);
  bOnDemandRetrievalFlag = (flags >> 7) & 0x01;  // oxxxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bOnDemandRetrievalFlag [%d]\n", bOnDemandRetrievalFlag);
  bFileStorableFlag = (flags >> 6) & 0x01;  // xfxxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bFileStorableFlag [%d]\n", bFileStorableFlag);
  bEventSectionFlag = (flags >> 5) & 0x01;  // xxexxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bEventSectionFlag [%d]\n", bEventSectionFlag);
  return kRavelOk;
}

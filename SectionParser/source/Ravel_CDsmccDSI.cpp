#include "Ravel_CDsmccDSI.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDsmccDSI");

RavelCDsmccDSI::RavelCDsmccDSI(unsigned char* data)
    : RavelCDsmccBase(0), cNASP(0), iPrivateDataLength(0), pPrivateData(0) {
  ParseRawData(data);
}

RavelCDsmccDSI::~RavelCDsmccDSI() {}

int RavelCDsmccDSI::ParseRawData(unsigned char* data) {
  RavelCDsmccBase::ParseRawData(data);
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "RavelCDsmccDSI::ParseRawData... \n");
  if (data == 0) return kRavelErrInvalidArgument;
  unsigned char* serverId = data + 12 + iAdaptationLength;
  int result = cNASP.ParseRawData(serverId);
  if (result != kRavelOk) return result;
  // The compatibility descriptor at serverId + 20 is taken to be empty (its
  // 16-bit length 0), so privateDataLength follows at serverId + 22.
  iPrivateDataLength = RavelRead16(serverId + 22);
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "Private data length [%d]\n", iPrivateDataLength);
  pPrivateData = serverId + 24;
  return kRavelOk;
}

void RavelCDsmccDSI::Show() {
  RavelCDsmccBase::Show();
  cNASP.Show();
}

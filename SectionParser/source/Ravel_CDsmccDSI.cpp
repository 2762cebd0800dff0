#include "Ravel_CDsmccDSI.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDsmccDSI");

// ---------------------------------------------------------------------------
// RavelCNASP, the server id record, lives with the message that carries it and
// reports its traces from here.

RavelCNASP::RavelCNASP(unsigned char* data) {
  Clear();
  ParseRawData(data);
}

RavelCNASP::~RavelCNASP() {}

void RavelCNASP::Clear() {
  iAFI = 0;
  iType = 0;
  iCarouselId = 0;
  iSpecifier = 0;
  iTransportStreamId = 0;
  iOriginalNetworkId = 0;
  iServiceId = 0;
}

int RavelCNASP::ParseRawData(unsigned char* data) {
  if (data == 0) {
    RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "NASP Input Data is NULL!\n");
    Clear();
    return kRavelErrInvalidArgument;
  }
  iAFI = RavelCReadWindow::Read8(data);
  iType = RavelCReadWindow::Read8(data + 1);
  iCarouselId = RavelCReadWindow::Read32(data + 2);
  iSpecifier = RavelCReadWindow::Read32(data + 6);
  iTransportStreamId = RavelCReadWindow::Read16(data + 10);
  iOriginalNetworkId = RavelCReadWindow::Read16(data + 12);
  iServiceId = RavelCReadWindow::Read16(data + 14);
  return kRavelOk;
}

void RavelCNASP::Show() {
  // "CaourselID" is the label the receivers' logs are matched against.
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP, "\t\tNASP: AFI=[0x%02x], Type=[0x%02x], CaourselID=[0x%08x], iSpecifier=[0x%08x]\n",
              iAFI, iType, iCarouselId, iSpecifier);
  RAVEL_TRACE(RAVEL_CAROUSEL_DUMP,
              "\t\tNASP(Ginga Service Location): Transport Stream Id=[0x%04x], Original Network ID=[0x%04x], Service "
              "ID=[0x%04x]\n",
              iTransportStreamId, iOriginalNetworkId, iServiceId);
}

// ---------------------------------------------------------------------------
// RavelCDsmccDSI

RavelCDsmccDSI::RavelCDsmccDSI(unsigned char* data)
    : RavelCDsmccBase(0), cNASP(0) {
  ParseRawData(data);
}

RavelCDsmccDSI::~RavelCDsmccDSI() {}

int RavelCDsmccDSI::ParseRawData(unsigned char* data) {
  RavelCReadWindow window(RavelCReadWindow::SectionOfMessage(data));
  RavelCDsmccBase::ParseRawData(data);
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "RavelCDsmccDSI::ParseRawData... \n");
  if (data == 0) return kRavelErrInvalidArgument;
  unsigned char* serverId = data + 12 + iAdaptationLength;
  int result = cNASP.ParseRawData(serverId);
  if (result != kRavelOk) return result;
  // The compatibility descriptor at serverId + 20 is taken to be empty (its
  // 16-bit length 0), so privateDataLength follows at serverId + 22.
  iPrivateDataLength = RavelCReadWindow::Read16(serverId + 22);
  RAVEL_TRACE(RAVEL_CAROUSEL_WARNING, "Private data length [%d]\n", iPrivateDataLength);
  pPrivateData = serverId + 24;
  return kRavelOk;
}

void RavelCDsmccDSI::Show() {
  RavelCDsmccBase::Show();
  cNASP.Show();
}

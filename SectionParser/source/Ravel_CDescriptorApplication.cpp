#include "Ravel_CDescriptorApplication.h"

#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorApplication");

// The application descriptors dump at the information level.
static const unsigned int kShowMask = RAVEL_PARSER_WARNING;

const RavelCDescriptorKind RavelCApplicationDescriptor::kKind = {
    0x00, "Application Descriptor", 0 /* any tag */,
    "\t=================== Application Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCApplicationDescriptor::RavelCApplicationDescriptor(unsigned char* raw) {
  Clear();
  ParseRawData(raw);
}

RavelCApplicationDescriptor::RavelCApplicationDescriptor(RavelCApplicationDescriptor&) = default;

RavelCApplicationDescriptor& RavelCApplicationDescriptor::operator=(RavelCApplicationDescriptor&) = default;

RavelCApplicationDescriptor::~RavelCApplicationDescriptor() {}

void RavelCApplicationDescriptor::Clear() {
  iApplicationProfile = 0;
  iVersionMajor = 0;
  iVersionMinor = 0;
  iVersionMicro = 0;
  bServiceBoundFlag = 0;
  iVisibility = 0;
  iAppPriority = 0;
  iAppTransportLabel = 0;
}

int RavelCApplicationDescriptor::ParseRawData(unsigned char* raw) {
  Clear();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  RavelCBitInputStream reader = RavelCReadWindow::Reader(raw + 2, iDescriptorLength);
  unsigned char status = 0;
  reader.ReadByte(8, status);  // application_profiles_length: one profile is read whatever it says
  iApplicationProfile = reader.ReadShort(16, status);
  iVersionMajor = reader.ReadByte(8, status);
  iVersionMinor = reader.ReadByte(8, status);
  iVersionMicro = reader.ReadByte(8, status);
  bServiceBoundFlag = reader.ReadByte(1, status);  // bxxxxxxx
  iVisibility = reader.ReadByte(2, status);        // xvvxxxxx
  reader.Skip(5);                                  // xxxrrrrr
  iAppPriority = reader.ReadByte(8, status);
  iAppTransportLabel = reader.ReadByte(8, status);
  return kRavelOk;
}

void RavelCApplicationDescriptor::Show() {
  ShowHeader(kKind, __LINE__, kShowMask);
  RAVEL_TRACE(kShowMask,
              "\t iApplicationProfile=%u, iVersionMajor=%u, iVersionMinor=%u, iVersionMicro %u, "
              "bServiceBoundFlag=%u, iVisibility=%u, iAppPriority=%u, iAppTransportLabel=%u \n",
              static_cast<unsigned int>(iApplicationProfile), iVersionMajor, iVersionMinor, iVersionMicro,
              bServiceBoundFlag, static_cast<unsigned int>(iVisibility), iAppPriority, iAppTransportLabel);
}

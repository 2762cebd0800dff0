#include "Ravel_CDescriptorComponent.h"

#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorComponent");

const RavelCDescriptorKind RavelCComponentDescriptor::kKind = {
    0x50, "Component Descriptor", "This Descriptor isn't Component Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Component Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCComponentDescriptor::RavelCComponentDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCComponentDescriptor::RavelCComponentDescriptor(RavelCComponentDescriptor&) = default;

RavelCComponentDescriptor& RavelCComponentDescriptor::operator=(RavelCComponentDescriptor&) = default;

RavelCComponentDescriptor::~RavelCComponentDescriptor() {}

void RavelCComponentDescriptor::Clear() {
  iStreamContent = 0;
  iComponentType = 0;
  iComponentTag = 0;
  iISO639LanguageCode = 0;
}

int RavelCComponentDescriptor::ParseRawData(unsigned char* raw) {
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) {
    Clear();
    return result;
  }
  unsigned char status = 0;
  RavelCBitInputStream reader = RavelCReadWindow::Reader(raw + 2, iDescriptorLength);
  reader.Skip(4);                                      // xxxx....
  iStreamContent = reader.ReadByte(4, status);         // ....xxxx
  iComponentType = reader.ReadByte(8, status);
  iComponentTag = reader.ReadByte(8, status);
  iISO639LanguageCode = reader.ReadInt(24, status);
  return kRavelOk;
}

void RavelCComponentDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "\tiStreamContent=[0x%x], iComponentType=[0x%x], iComponentTag=[0x%x], ISO Language Code=[0x%x]\n",
              iStreamContent, iComponentType, iComponentTag, iISO639LanguageCode);
}

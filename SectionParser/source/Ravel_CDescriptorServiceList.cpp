#include "Ravel_CDescriptorServiceList.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorServiceList");

const RavelCDescriptorKind RavelCServiceListDescriptor::kKind = {
    0x41, "Service List Descriptor",
    "This Descriptor isn't Service List Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Service List Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCServiceListDescriptor::RavelCServiceListDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCServiceListDescriptor::RavelCServiceListDescriptor(RavelCServiceListDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCServiceListDescriptor& RavelCServiceListDescriptor::operator=(RavelCServiceListDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  if (other.iServiceCount > 0) {
    pServiceIds = new unsigned short[other.iServiceCount];
    pServiceTypes = new unsigned char[other.iServiceCount];
    for (int i = 0; i < other.iServiceCount; ++i) {
      pServiceIds[i] = other.pServiceIds[i];
      pServiceTypes[i] = other.pServiceTypes[i];
    }
  }
  iServiceCount = other.iServiceCount;
  return *this;
}

RavelCServiceListDescriptor::~RavelCServiceListDescriptor() { Release(); }

void RavelCServiceListDescriptor::Release() {
  delete[] pServiceIds;
  pServiceIds = 0;
  delete[] pServiceTypes;
  pServiceTypes = 0;
  iServiceCount = 0;
}

int RavelCServiceListDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  if (iDescriptorLength <= 2) {
    // Not even one 3-byte entry: an empty list is still a valid descriptor.
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Empty Service List Descriptor!\n");
    return kRavelOk;
  }
  iServiceCount = iDescriptorLength / 3;
  pServiceIds = new unsigned short[iServiceCount];
  pServiceTypes = new unsigned char[iServiceCount];
  const unsigned char* entry = raw + 2;
  for (int i = 0; i < iServiceCount; ++i, entry += 3) {
    pServiceIds[i] = RavelCReadWindow::Read16(entry);
    pServiceTypes[i] = RavelCReadWindow::Read8(entry + 2);
  }
  return kRavelOk;
}

int RavelCServiceListDescriptor::GetServiceInfo(int index, unsigned short& serviceId, unsigned short& serviceType) {
  if (index < 0 || index >= iServiceCount) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Array Index! aIndex=[%d], array len=[%d]\n", index, iServiceCount);
    serviceId = 0;
    serviceType = 0;
    return 0;
  }
  serviceId = pServiceIds[index];
  serviceType = pServiceTypes[index];
  return 1;
}

void RavelCServiceListDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tService List Length=[%d]\n", iServiceCount);
  for (int i = 0; i < iServiceCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\t[%d]th Service Info: Service ID=[0x%04x], Service Type=[0x%02x]\n", i,
                pServiceIds[i], pServiceTypes[i]);
  }
}

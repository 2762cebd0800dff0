#include "Ravel_CDescriptorTerrDeliverySystem.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_Cfg.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorTerrDeliverySystem");

const RavelCDescriptorKind RavelCTerrDeliverySystemDescriptor::kKind = {
    0xFA, "Terrestrial Delivery System Descriptor",
    "This Descriptor isn't Terrestrial Delivery System Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Terrestrial Delivery Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, true, kRavelTraceSourcePath};

RavelCTerrDeliverySystemDescriptor::RavelCTerrDeliverySystemDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCTerrDeliverySystemDescriptor::RavelCTerrDeliverySystemDescriptor(RavelCTerrDeliverySystemDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCTerrDeliverySystemDescriptor& RavelCTerrDeliverySystemDescriptor::operator=(
    RavelCTerrDeliverySystemDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iAreaCode = other.iAreaCode;
  iGuardInterval = other.iGuardInterval;
  iTransmissionMode = other.iTransmissionMode;
  iFrequencyCount = other.iFrequencyCount;
  if (iFrequencyCount > 0) {
    pFrequencies = new unsigned short[iFrequencyCount];
    for (int i = 0; i < iFrequencyCount; ++i) pFrequencies[i] = other.pFrequencies[i];
  }
  return *this;
}

RavelCTerrDeliverySystemDescriptor::~RavelCTerrDeliverySystemDescriptor() { Release(); }

void RavelCTerrDeliverySystemDescriptor::Release() {
  delete[] pFrequencies;
  pFrequencies = 0;
  iFrequencyCount = 0;
}

int RavelCTerrDeliverySystemDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iAreaCode = RavelCReadWindow::Read16(raw + 2) >> 4;  // xxxxxxxx xxxx----
  const unsigned char mode = RavelCReadWindow::Read8(raw + 3);
  iGuardInterval = (mode >> 2) & 0x03;  // ----xx--
  iTransmissionMode = mode & 0x03;      // ------xx
  // Signed on purpose: a descriptor without even the area code gives -1.
  int bodyLength = iDescriptorLength - 2;
  iFrequencyCount = bodyLength / 2;
  if (iFrequencyCount > 0) {
    pFrequencies = new unsigned short[iFrequencyCount];
    for (int i = 0; i < iFrequencyCount; ++i) pFrequencies[i] = RavelCReadWindow::Read16(raw + 4 + 2 * i);
  }
  return kRavelOk;
}

unsigned short RavelCTerrDeliverySystemDescriptor::GetFrequency(int index) const {
  if (index < 0 || index >= iFrequencyCount) {
    RAVEL_PANIC();
    // The panic handler may return; the array is not read outside its bounds.
    return 0;
  }
  return pFrequencies[index];
}

int RavelCTerrDeliverySystemDescriptor::GetRegionId() const {
  // Region ids are defined by ABNT NBR 15603 only.
  if (RavelCfg_GetStandard() == RAVEL_STANDARD_JAPAN) return 0;
  int state = (iAreaCode >> 7) & 0x1F;  // xxxxx--- ----
  if (state >= 1 && state <= 4) return 4;
  if (state >= 5 && state <= 16) return 2;
  if ((state >= 17 && state <= 23) || state == 26) return 3;
  if (state == 24 || state == 25) return 5;
  if (state == 27) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "State Id[%d]: But the region id of ths state isn't specified by ABNT!\n",
                state);
    return 0;
  }
  // The receivers' logs show 0 in the State position for every unknown state.
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "Unknown State! Area Code=[0x%x], State=[%d]\n", iAreaCode, 0);
  return 0;
}

void RavelCTerrDeliverySystemDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tArea Code=[0x%04x], Guard Interval=[0x%02x], Tx Mode=[0x%02x], Num Of Freq=[%d]\n",
              iAreaCode, iGuardInterval, iTransmissionMode, iFrequencyCount);
  for (int i = 0; i < iFrequencyCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\tTerrDelSys: Frequency=[%d]\n", pFrequencies[i]);
  }
}

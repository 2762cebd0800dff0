#include "Ravel_CDescriptorTSInformation.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorTSInformation");

const RavelCDescriptorKind RavelCTSInformationDescriptor::kKind = {
    0xCD, "TS Information Descriptor", "This Descriptor isn't TS Information Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== TS Information Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCTSInformationDescriptor::RavelCTSInformationDescriptor(unsigned char* raw)
    : sTsName() {
  ParseRawData(raw);
}

RavelCTSInformationDescriptor::RavelCTSInformationDescriptor(RavelCTSInformationDescriptor&) = default;

RavelCTSInformationDescriptor& RavelCTSInformationDescriptor::operator=(RavelCTSInformationDescriptor&) = default;

RavelCTSInformationDescriptor::~RavelCTSInformationDescriptor() {}

void RavelCTSInformationDescriptor::ClearTxTypes() {
  for (int i = 0; i < kTxTypeSlots; ++i) cTxTypes[i].ParseRawData(0);
}

int RavelCTSInformationDescriptor::ParseRawData(unsigned char* raw) {
  sTsName = "";
  int result = ParseHeader(raw, kKind, __LINE__);
  if (raw == 0) {
    iRemoteControlKeyId = 0;
    iTransmissionTypeCount = 0;
    ClearTxTypes();
  }
  // A foreign tag leaves the key id, the count and the records of the last
  // descriptor as they were; only the name is released.
  if (result != kRavelOk) return result;
  ClearTxTypes();
  iRemoteControlKeyId = RavelCReadWindow::Read8(raw + 2);
  const unsigned char counts = RavelCReadWindow::Read8(raw + 3);
  int nameLength = counts >> 2;              // xxxxxx--
  iTransmissionTypeCount = counts & 0x03;    // ------xx
  RavelText_SetString(sTsName, raw + 4, nameLength);
  unsigned char* record = raw + 4 + nameLength;
  for (int i = 0; i < iTransmissionTypeCount; ++i) {
    cTxTypes[i].ParseRawData(record);
    record += cTxTypes[i].GetRecordSize();
  }
  return kRavelOk;
}

void RavelCTSInformationDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tRemote Control Key Id=[0x%02x], Ts Name=[%s], Tx Type Count=[%d]\n",
              iRemoteControlKeyId, sTsName.GetString(), iTransmissionTypeCount);
  for (int i = 0; i < iTransmissionTypeCount && i < kTxTypeSlots; ++i) cTxTypes[i].Show();
}

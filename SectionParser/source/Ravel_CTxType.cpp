#include "Ravel_CTxType.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTxType");

RavelCTxType::RavelCTxType() {}

RavelCTxType::RavelCTxType(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCTxType::RavelCTxType(const RavelCTxType& other) {
  *this = other;
}

RavelCTxType& RavelCTxType::operator=(const RavelCTxType& other) {
  if (this == &other) return *this;
  Release();
  iTransmissionTypeInfo = other.iTransmissionTypeInfo;
  iNumOfService = other.iNumOfService;
  if (iNumOfService > 0) {
    pServiceIds = new unsigned short[iNumOfService];
    for (int i = 0; i < iNumOfService; ++i) pServiceIds[i] = other.pServiceIds[i];
  }
  return *this;
}

RavelCTxType::~RavelCTxType() { Release(); }

void RavelCTxType::Release() {
  delete[] pServiceIds;
  pServiceIds = 0;
}

int RavelCTxType::ParseRawData(unsigned char* raw) {
  Release();
  if (raw == 0) {
    iTransmissionTypeInfo = 0;
    iNumOfService = 0;
    return kRavelErrInvalidArgument;
  }
  iTransmissionTypeInfo = RavelCReadWindow::Read8(raw);
  iNumOfService = RavelCReadWindow::Read8(raw + 1);
  if (iNumOfService > 0) {
    // The list keeps its count: identifiers beyond the section read as 0.
    pServiceIds = new unsigned short[iNumOfService];
    for (int i = 0; i < iNumOfService; ++i) pServiceIds[i] = RavelCReadWindow::Read16(raw + 2 + 2 * i);
  }
  return kRavelOk;
}

unsigned short RavelCTxType::GetServiceId(int index) const {
  if (index < 0 || index >= iNumOfService) {
    RAVEL_PANIC();
    // The panic handler may return; the array is not read outside its bounds.
    return 0;
  }
  return pServiceIds[index];
}

void RavelCTxType::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\tTramsmission Type Info=[0x%02x], Num of Service=[%d]\n", iTransmissionTypeInfo,
              iNumOfService);
  for (int i = 0; i < iNumOfService; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\t\tTS Info: Service Id=[0x%04x]\n", pServiceIds[i]);
  }
}

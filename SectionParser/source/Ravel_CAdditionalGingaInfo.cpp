#include "Ravel_CAdditionalGingaInfo.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CAdditionalGingaInfo");

// Only the object carousel format carries a record of its own.
static const unsigned char kObjectCarouselFormat = 2;

RavelCAdditionalGingaInfo::RavelCAdditionalGingaInfo() { Clear(); }

RavelCAdditionalGingaInfo::RavelCAdditionalGingaInfo(const RavelCAdditionalGingaInfo& other) {
  Clear();
  *this = other;
}

RavelCAdditionalGingaInfo& RavelCAdditionalGingaInfo::operator=(const RavelCAdditionalGingaInfo& other) {
  if (this == &other) return *this;
  Clear();
  iTransmissionFormat = other.iTransmissionFormat;
  bApplicationIdentifierFlag = other.bApplicationIdentifierFlag;
  iDocumentResolution = other.iDocumentResolution;
  bIndependentFlag = other.bIndependentFlag;
  iApplicationIdentifierOrgId = other.iApplicationIdentifierOrgId;
  iApplicationIdentifierAppId = other.iApplicationIdentifierAppId;
  if (other.pData != 0) pData = new RavelCObjectCarouselTransmissionFormat(*other.pData);
  return *this;
}

RavelCAdditionalGingaInfo::~RavelCAdditionalGingaInfo() { Clear(); }

void RavelCAdditionalGingaInfo::Clear() {
  delete pData;
  pData = 0;
  iTransmissionFormat = 0;
  bApplicationIdentifierFlag = 0;
  iDocumentResolution = 0;
  bIndependentFlag = 0;
  iApplicationIdentifierOrgId = 0;
  iApplicationIdentifierAppId = 0;
}

int RavelCAdditionalGingaInfo::ParseRawData(const unsigned char* raw) {
  Clear();
  if (raw == 0) return kRavelErrInvalidArgument;
  const unsigned char* position = raw;
  const unsigned char flags = RavelCReadWindow::Read8(position);
  iTransmissionFormat = flags >> 6;  // ttxxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "iTransmissionFormat [0x%x]\n", iTransmissionFormat);
  bApplicationIdentifierFlag = (flags >> 5) & 0x01;  // xxaxxxxx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bApplicationIdentifierFlag [0x%x]\n", bApplicationIdentifierFlag);
  iDocumentResolution = (flags >> 1) & 0x0F;  // xxxddddx
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "iDocumentResolution [0x%x]\n", iDocumentResolution);
  bIndependentFlag = flags & 0x01;  // xxxxxxxi
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "bIndependentFlag [%d]\n", bIndependentFlag);
  position += 1;
  if (bApplicationIdentifierFlag) {
    iApplicationIdentifierOrgId = RavelCReadWindow::Read32(position);
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "iApplicationIdentifierOrgId [0x%08x]\n", iApplicationIdentifierOrgId);
    iApplicationIdentifierAppId = RavelCReadWindow::Read16(position + 4);
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "iApplicationIdentifierAppId [0x%04x]\n", iApplicationIdentifierAppId);
    position += 6;
  }
  if (iTransmissionFormat == kObjectCarouselFormat) {
    pData = new RavelCObjectCarouselTransmissionFormat();
    pData->ParseRawData(position);
  } else {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Transmission format not supported!!\n");
  }
  return kRavelOk;
}

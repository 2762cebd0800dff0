#include "Ravel_CDescriptorSeries.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorSeries");

const RavelCDescriptorKind RavelCSeriesDescriptor::kKind = {
    0xD5, "Series Descriptor", "This Descriptor isn't Series Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Series Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCSeriesDescriptor::RavelCSeriesDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCSeriesDescriptor::RavelCSeriesDescriptor(RavelCSeriesDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCSeriesDescriptor& RavelCSeriesDescriptor::operator=(RavelCSeriesDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iSeriesId = other.iSeriesId;
  iRepeatLabel = other.iRepeatLabel;
  iProgramPattern = other.iProgramPattern;
  iExpireDateValidFlag = other.iExpireDateValidFlag;
  iExpireDate = other.iExpireDate;
  iEpisodeNumber = other.iEpisodeNumber;
  iLastEpisodeNumber = other.iLastEpisodeNumber;
  pSeriesName = RavelText_DuplicateCText(other.pSeriesName);
  return *this;
}

RavelCSeriesDescriptor::~RavelCSeriesDescriptor() { Release(); }

void RavelCSeriesDescriptor::Release() {
  RavelText_FreeCText(pSeriesName);
  iSeriesId = 0;
  iRepeatLabel = 0;
  iProgramPattern = 0;
  iExpireDateValidFlag = 0;
  iExpireDate = 0;
  iEpisodeNumber = 0;
  iLastEpisodeNumber = 0;
}

int RavelCSeriesDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iSeriesId = RavelCReadWindow::Read16(raw + 2);
  const unsigned char flags = RavelCReadWindow::Read8(raw + 4);
  iRepeatLabel = static_cast<unsigned char>(flags >> 4);                 // xxxx....
  iProgramPattern = static_cast<unsigned char>((flags >> 1) & 0x07);     // ....xxx.
  iExpireDateValidFlag = static_cast<unsigned char>(flags & 0x01);       // .......x
  iExpireDate = RavelCReadWindow::Read16(raw + 5);
  const unsigned int episodes = RavelCReadWindow::Read24(raw + 7);
  iEpisodeNumber = static_cast<unsigned short>(episodes >> 12);          // 12 bits
  iLastEpisodeNumber = static_cast<unsigned short>(episodes & 0x0FFF);   // 12 bits
  if (iDescriptorLength >= 9) pSeriesName = RavelText_NewCText(raw + 10, iDescriptorLength - 8);
  return kRavelOk;
}

void RavelCSeriesDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tSeriesId=[%d]\n", iSeriesId);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tRepeatLabel=[%d]\n", iRepeatLabel);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tProgramPattern=[%d]\n", iProgramPattern);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tExpireDateValidFlag=[%d]\n", iExpireDateValidFlag);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tExpireDate=[%d]\n", iExpireDate);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tEpisodeNumber=[%d]\n", iEpisodeNumber);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLastEpisodeNumber=[%d]\n", iLastEpisodeNumber);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tSeriesName=[%s]\n", RavelTraceText(pSeriesName));
}

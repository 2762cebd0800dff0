#include "Ravel_CDescriptorAudioComponent.h"

#include <cstring>

#include "Ravel_CBitInputStream.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorAudioComponent");

// The audio class reuses the component descriptor's message and banner.
const RavelCDescriptorKind RavelCAudioComponentDescriptor::kKind = {
    0xC4, "Audio Component Descriptor", "This Descriptor isn't Component Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Component Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

namespace {

// The three letters of a 24-bit code, high byte first, and a 0.
void SetCodeText(char (&text)[4], unsigned int code) {
  text[0] = static_cast<char>((code >> 16) & 0xFF);
  text[1] = static_cast<char>((code >> 8) & 0xFF);
  text[2] = static_cast<char>(code & 0xFF);
  text[3] = '\0';
}

}  // namespace

RavelCAudioComponentDescriptor::RavelCAudioComponentDescriptor(unsigned char* raw) {
  Clear();
  ParseRawData(raw);
}

RavelCAudioComponentDescriptor::RavelCAudioComponentDescriptor(RavelCAudioComponentDescriptor&) = default;

RavelCAudioComponentDescriptor& RavelCAudioComponentDescriptor::operator=(RavelCAudioComponentDescriptor&) = default;

RavelCAudioComponentDescriptor::~RavelCAudioComponentDescriptor() {}

void RavelCAudioComponentDescriptor::Clear() {
  iStreamContent = 0;
  iComponentType = 0;
  iComponentTag = 0;
  iStreamType = 0;
  iSimulcastGroupTag = 0;
  iESMultiLingualFlag = 0;
  iMainComponentFlag = 0;
  iQualityIndicator = 0;
  iSampleRate = 0;
  iISO639LanguageCode = 0;
  std::memset(szLanguageCode, 0, sizeof(szLanguageCode));
  iISO639LanguageCode2 = 0;
  std::memset(szLanguageCode2, 0, sizeof(szLanguageCode2));
}

int RavelCAudioComponentDescriptor::ParseRawData(unsigned char* raw) {
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
  iStreamType = reader.ReadByte(8, status);
  iSimulcastGroupTag = reader.ReadByte(8, status);
  iESMultiLingualFlag = reader.ReadByte(1, status);    // x.......
  iMainComponentFlag = reader.ReadByte(1, status);     // .x......
  iQualityIndicator = reader.ReadByte(2, status);      // ..xx....
  iSampleRate = reader.ReadByte(3, status);            // ....xxx.
  reader.Skip(1);                                      // .......x
  iISO639LanguageCode = reader.ReadInt(24, status);
  SetCodeText(szLanguageCode, iISO639LanguageCode);
  iISO639LanguageCode2 = iESMultiLingualFlag == 1 ? reader.ReadInt(24, status) : 0;
  SetCodeText(szLanguageCode2, iISO639LanguageCode2);
  return kRavelOk;
}

void RavelCAudioComponentDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP,
              "\tiStreamContent=[0x%x], iComponentType=[0x%x], iComponentTag=[0x%x],iStreamType=[0x%x], "
              "iSimulcastGroupTag=[0x%x], iESMultiLingualFlag=[0x%x], iMainComponentFlag=[0x%x], "
              "iQualityIndicator=[0x%x], iSampleRate=[0x%x], ISO Language Code=[0x%x], ISO Language Code2=[0x%x]\n",
              iStreamContent, iComponentType, iComponentTag, iStreamType, iSimulcastGroupTag, iESMultiLingualFlag,
              iMainComponentFlag, iQualityIndicator, iSampleRate, iISO639LanguageCode, iISO639LanguageCode2);
}

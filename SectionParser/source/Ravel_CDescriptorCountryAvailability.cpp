#include "Ravel_CDescriptorCountryAvailability.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_RecordList.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorCountryAvailability");

const RavelCDescriptorKind RavelCCountryAvailabilityDescriptor::kKind = {
    0x49, "Country Availabilty Descriptor",
    "This Descriptor isn't Country Availability Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Country Availability Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCCountryAvailabilityDescriptor::RavelCCountryAvailabilityDescriptor(unsigned char* raw)
    : aCountryCodes() {
  ParseRawData(raw);
}

RavelCCountryAvailabilityDescriptor::RavelCCountryAvailabilityDescriptor(RavelCCountryAvailabilityDescriptor& other)
    : RavelCDescriptorBase(other), aCountryCodes() {
  *this = other;
}

RavelCCountryAvailabilityDescriptor& RavelCCountryAvailabilityDescriptor::operator=(
    RavelCCountryAvailabilityDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iCountryAvailabilityFlag = other.iCountryAvailabilityFlag;
  RavelRecordList_AppendCopies(aCountryCodes, other.aCountryCodes);
  return *this;
}

RavelCCountryAvailabilityDescriptor::~RavelCCountryAvailabilityDescriptor() { Release(); }

void RavelCCountryAvailabilityDescriptor::Release() {
  RavelRecordList_DeleteAll(aCountryCodes);
  iCountryAvailabilityFlag = 0;
}

int RavelCCountryAvailabilityDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iCountryAvailabilityFlag = static_cast<unsigned char>(RavelCReadWindow::Read8(raw + 2) >> 7);  // x.......
  // Steps of 3 while the code starts inside the body (and the section); a code
  // holding a 0 byte is shorter than 3 letters and leaves its record empty.
  const unsigned char* end = RavelCReadWindow::Clamp(raw + 3, raw + 2 + iDescriptorLength);
  for (const unsigned char* at = raw + 3; at < end; at += 3) {
    char code[4] = {'\0', '\0', '\0', '\0'};
    RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(code), at, 3);
    aCountryCodes.Append(new RavelCCountryCode(code));
  }
  return kRavelOk;
}

void RavelCCountryAvailabilityDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Ability flag = %d\n", iCountryAvailabilityFlag);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t Codes: \n");
  for (int i = 0; i < aCountryCodes.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t    %s\n", aCountryCodes.ipArray[i]->szCountryCode);
  }
}

#include "Ravel_CDescriptorParentalRating.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_Cfg.h"
#include "Ravel_RecordList.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorParentalRating");

RavelCParentalRating::RavelCParentalRating() {
}

RavelCParentalRating::RavelCParentalRating(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCParentalRating::~RavelCParentalRating() {}

int RavelCParentalRating::ParseRawData(unsigned char* raw) {
  if (raw == 0) return kRavelErrInvalidArgument;
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(szCountryCode), raw, 3);
  szCountryCode[3] = '\0';
  const unsigned char rating = RavelCReadWindow::Read8(raw + 3);
  if (RavelCfg_GetStandard() == RAVEL_STANDARD_JAPAN) {
    iMinimumAge = (rating >= 1 && rating <= 15) ? static_cast<unsigned char>(rating + 3) : 0;
    return kRavelOk;
  }
  iContent = static_cast<unsigned char>(rating >> 4);            // xxxx....
  const unsigned char ageSelector = rating & 0x0F;               // ....xxxx
  switch (ageSelector) {
    case 1: iMinimumAge = 0; break;  // "L": free for all ages
    case 2: iMinimumAge = 10; break;
    case 3: iMinimumAge = 12; break;
    case 4: iMinimumAge = 14; break;
    case 5: iMinimumAge = 16; break;
    case 6: iMinimumAge = 18; break;
    default:
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Unknown ageSelector=[%d]\n", ageSelector);
      iMinimumAge = 0;
      break;
  }
  return kRavelOk;
}

void RavelCParentalRating::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\tCountry Code=[%s], Content=[0x%02x], Mimimum Age = [%d] \n", szCountryCode,
              iContent, iMinimumAge);
}

const RavelCDescriptorKind RavelCParentalRatingDescriptor::kKind = {
    0x55, "Parental Rating Descriptor", "This Descriptor isn't ParentalRating Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Parental Rating Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCParentalRatingDescriptor::RavelCParentalRatingDescriptor(unsigned char* raw) : aParentalRatings() {
  ParseRawData(raw);
}

RavelCParentalRatingDescriptor::RavelCParentalRatingDescriptor(RavelCParentalRatingDescriptor& other)
    : RavelCDescriptorBase(other), aParentalRatings() {
  *this = other;
}

RavelCParentalRatingDescriptor& RavelCParentalRatingDescriptor::operator=(RavelCParentalRatingDescriptor& other) {
  if (this == &other) return *this;
  RavelRecordList_DeleteAll(aParentalRatings);
  RavelCDescriptorBase::operator=(other);
  RavelRecordList_AppendCopies(aParentalRatings, other.aParentalRatings);
  return *this;
}

RavelCParentalRatingDescriptor::~RavelCParentalRatingDescriptor() { RavelRecordList_DeleteAll(aParentalRatings); }

int RavelCParentalRatingDescriptor::ParseRawData(unsigned char* raw) {
  RavelRecordList_DeleteAll(aParentalRatings);
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  if (iDescriptorLength == 0) return kRavelOk;
  // Steps of 4 while the entry starts inside the body (and the section); a
  // partial last entry is read as a whole one.
  const unsigned char* end = RavelCReadWindow::Clamp(raw + 2, raw + 2 + iDescriptorLength);
  for (unsigned char* at = raw + 2; at < end; at += 4) {
    RavelCParentalRating* entry = new RavelCParentalRating();
    entry->ParseRawData(at);
    aParentalRatings.Append(entry);
  }
  return kRavelOk;
}

void RavelCParentalRatingDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  for (int i = 0; i < aParentalRatings.iCount; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t##################### ParentalRating [%d] #####################\n", i);
    aParentalRatings.ipArray[i]->Show();
  }
}

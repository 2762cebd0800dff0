// Parental rating descriptor (tag 0x55, ARIB STD-B10, ABNT NBR 15603-2),
// a loop of 4-byte entries:
//   country_code   24
//   rating          8
//
// The rating byte is read by the broadcast standard in force at parse time:
//   Japan (ARIB):  minimum age = rating + 3 for ratings 1 to 15, else 0.
//   Brazil (ABNT): content = rating >> 4 (xxxx....), and the age selector
//                  rating & 0x0F (....xxxx) maps 1 "L" -> 0, 2 -> 10, 3 -> 12,
//                  4 -> 14, 5 -> 16, 6 -> 18; any other selector gives 0.
#ifndef RAVEL_CDESCRIPTORPARENTALRATING_H
#define RAVEL_CDESCRIPTORPARENTALRATING_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorBase.h"

// One entry of the loop.
class RavelCParentalRating {
 public:
  RavelCParentalRating();
  // Zeroed, then parsed from the entry's first byte (null leaves it zeroed).
  explicit RavelCParentalRating(unsigned char* raw);
  virtual ~RavelCParentalRating();

  // Null gives -8; any entry gives 0, an unknown age selector included.
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetCountryCode() const { return szCountryCode; }
  unsigned char GetContent() const { return iContent; }
  unsigned char GetMinimumAge() const { return iMinimumAge; }

  char szCountryCode[4] = {};
  unsigned char iContent = 0;     // Brazil only; left as it is under the Japanese rules
  unsigned char iMinimumAge = 0;
};

class RavelCParentalRatingDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCParentalRatingDescriptor(unsigned char* raw);
  RavelCParentalRatingDescriptor(RavelCParentalRatingDescriptor& other);
  RavelCParentalRatingDescriptor& operator=(RavelCParentalRatingDescriptor& other);
  virtual ~RavelCParentalRatingDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetNumOfParentalRatings() const { return aParentalRatings.iCount; }
  // The entry at `index`; out of range panics through the array and yields null.
  RavelCParentalRating* GetParentalRating(int index) { return aParentalRatings[index]; }

  RavelCArray<RavelCParentalRating*> aParentalRatings;  // owned entries
};

#endif

// Country availability descriptor (tag 0x49, ARIB STD-B10, ABNT NBR 15603-2):
//   country_availability_flag   1   // x.......
//   reserved_future_use         7   // .xxxxxxx
//   country_code               24   (repeated to the end of the descriptor)
#ifndef RAVEL_CDESCRIPTORCOUNTRYAVAILABILITY_H
#define RAVEL_CDESCRIPTORCOUNTRYAVAILABILITY_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorBase.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"  // RavelCCountryCode

class RavelCCountryAvailabilityDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCCountryAvailabilityDescriptor(unsigned char* raw);
  RavelCCountryAvailabilityDescriptor(RavelCCountryAvailabilityDescriptor& other);
  RavelCCountryAvailabilityDescriptor& operator=(RavelCCountryAvailabilityDescriptor& other);
  virtual ~RavelCCountryAvailabilityDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetCountryAvailabilityFlag() const { return iCountryAvailabilityFlag; }
  int GetNumOfCountryCodes() const { return aCountryCodes.iCount; }
  // The code record at `index`; out of range panics through the array and yields null.
  RavelCCountryCode* GetCountryCode(int index) { return aCountryCodes[index]; }

  unsigned char iCountryAvailabilityFlag = 0;
  RavelCArray<RavelCCountryCode*> aCountryCodes;  // owned records

 private:
  void Release();
};

#endif

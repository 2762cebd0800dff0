// Terrestrial delivery system descriptor (tag 0xFA, ARIB STD-B10 / ABNT NBR 15603-2,
// terrestrial_delivery_system_descriptor):
//   area_code 12 | guard_interval 2 | transmission_mode 2 | { frequency 16 } ...
// Under the Brazilian rules the upper five bits of the area code are the state
// (ABNT NBR 15603-2 area code table), from which GetRegionId derives the region.
#ifndef RAVEL_CDESCRIPTORTERRDELIVERYSYSTEM_H
#define RAVEL_CDESCRIPTORTERRDELIVERYSYSTEM_H

#include "Ravel_CDescriptorBase.h"

class RavelCTerrDeliverySystemDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCTerrDeliverySystemDescriptor(unsigned char* raw);
  RavelCTerrDeliverySystemDescriptor(RavelCTerrDeliverySystemDescriptor& other);
  RavelCTerrDeliverySystemDescriptor& operator=(RavelCTerrDeliverySystemDescriptor& other);
  virtual ~RavelCTerrDeliverySystemDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned short GetAreaCode() const { return iAreaCode; }
  unsigned char GetGuardInterval() const { return iGuardInterval; }
  unsigned char GetTransmissionMode() const { return iTransmissionMode; }
  int GetFrequencyCount() const { return iFrequencyCount; }
  // In the descriptor's own units. An index outside 0..count-1 panics; if the
  // panic handler returns, gives 0.
  unsigned short GetFrequency(int index) const;
  // 0 under the Japanese rules; otherwise the region of the area code's state
  // (1-4: 4, 5-16: 2, 17-23 and 26: 3, 24-25: 5), 0 with a trace for the others.
  int GetRegionId() const;

  unsigned short iAreaCode = 0;        // 12 bits
  unsigned char iGuardInterval = 0;    // 2 bits
  unsigned char iTransmissionMode = 0; // 2 bits
  int iFrequencyCount = 0;             // (descriptor_length - 2) / 2; -1 for a length of 0
  unsigned short* pFrequencies = 0;    // iFrequencyCount entries (new[]), null when there are none

 private:
  void Release();
};

#endif

// Extended broadcaster descriptor (tag 0xCE, ARIB STD-B10, extended_broadcaster_descriptor):
//   broadcaster_type 4 | reserved 4
//   broadcaster_type 1 or 2:
//     terrestrial_broadcaster_id (or terrestrial_sound_broadcaster_id) 16
//     number_of_affiliation_id_loop 4 | number_of_broadcaster_id_loop 4
//     { affiliation_id 8 } | { original_network_id 16 | broadcaster_id 8 } | private_data_byte ...
#ifndef RAVEL_CDESCRIPTOREXTENDEDBROADCASTER_H
#define RAVEL_CDESCRIPTOREXTENDEDBROADCASTER_H

#include "Ravel_CDescriptorBase.h"

class RavelCExtendedBroadcasterDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;
  // Both loop counts have four bits, so at most 15 entries reach the arrays.
  enum { kMaxIds = 16 };

  explicit RavelCExtendedBroadcasterDescriptor(unsigned char* raw);
  RavelCExtendedBroadcasterDescriptor(RavelCExtendedBroadcasterDescriptor& other);
  RavelCExtendedBroadcasterDescriptor& operator=(RavelCExtendedBroadcasterDescriptor& other);
  virtual ~RavelCExtendedBroadcasterDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetBroadcasterType() const { return iBroadcasterType; }
  unsigned short GetTerrestrialBroadcasterId() const { return iTerrestrialBroadcasterId; }
  unsigned char GetNumberOfAffiliationIds() const { return iNumberOfAffiliationIds; }
  unsigned char GetNumberOfBroadcasterIds() const { return iNumberOfBroadcasterIds; }
  // Array slots 0..15; any other index gives 0.
  unsigned char GetAffiliationId(int index) const { return InRange(index) ? aAffiliationIds[index] : 0; }
  unsigned short GetOriginalNetworkId(int index) const { return InRange(index) ? aOriginalNetworkIds[index] : 0; }
  unsigned char GetBroadcasterId(int index) const { return InRange(index) ? aBroadcasterIds[index] : 0; }

  unsigned char iBroadcasterType = 0;             // 0..15
  unsigned short iTerrestrialBroadcasterId = 0;   // the terrestrial sound broadcaster id for type 2
  unsigned char iNumberOfAffiliationIds;      // 0..15
  unsigned char iNumberOfBroadcasterIds;      // 0..15
  unsigned char aAffiliationIds[kMaxIds];
  unsigned short aOriginalNetworkIds[kMaxIds];
  unsigned char aBroadcasterIds[kMaxIds];

 private:
  static bool InRange(int index) { return index >= 0 && index < kMaxIds; }
  void Release();
};

#endif

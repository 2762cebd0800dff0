// Broadcaster information table (table_id 0xC4, ARIB STD-B10 5.2.13), after the
// long section header (table id extension = original_network_id):
//   reserved 3 | broadcaster_view_propriety 1 | first_descriptors_length 12
//   first descriptors (read for their headers only)
//   broadcaster loop, up to the CRC_32:
//     broadcaster_id 8 | reserved 4 | broadcaster_descriptors_length 12 | descriptors
//   CRC_32
// Of each broadcaster only the first descriptor is looked at, and kept when it is
// an extended broadcaster descriptor (0xCE).
#ifndef RAVEL_CTABLEBIT_H
#define RAVEL_CTABLEBIT_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorExtendedBroadcaster.h"
#include "Ravel_CTableBase.h"

// One broadcaster of the BIT's broadcaster loop (a loop record, not a descriptor).
class RavelCBroadcasterDescriptor {
 public:
  explicit RavelCBroadcasterDescriptor(unsigned char* record);
  RavelCBroadcasterDescriptor(RavelCBroadcasterDescriptor& other);
  RavelCBroadcasterDescriptor& operator=(RavelCBroadcasterDescriptor& other);
  virtual ~RavelCBroadcasterDescriptor();

  // Null clears both fields and gives -8; a first descriptor with tag 0 or
  // length 0 clears everything and gives -24.
  virtual int ParseRawData(unsigned char* record);
  virtual void Show();

  unsigned char GetBroadcasterId() const { return iBroadcasterId; }
  unsigned short GetBroadcasterDescriptorsLength() const { return iBroadcasterDescriptorsLength; }
  RavelCExtendedBroadcasterDescriptor* GetExtendedBroadcaster() { return pExtendedBroadcasterDescriptor; }

  unsigned char iBroadcasterId = 0;
  unsigned short iBroadcasterDescriptorsLength = 0;  // 12 bits
  RavelCExtendedBroadcasterDescriptor* pExtendedBroadcasterDescriptor = 0;  // owned, or null

 private:
  void DeleteDescriptor();
};

class RavelCBIT : public RavelCTableBase {
 public:
  explicit RavelCBIT(unsigned char* section);
  RavelCBIT(RavelCBIT& other);
  RavelCBIT& operator=(RavelCBIT& other);
  virtual ~RavelCBIT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  // Appends a copy of every record of `other`; nothing is compared.
  RavelCBIT& operator+=(RavelCBIT& other);

  unsigned char GetBroadcasterViewPropriety() const { return bBroadcasterViewPropriety; }
  unsigned short GetFirstDescriptorsLength() const { return iFirstDescriptorsLength; }
  int GetBroadcasterCount() const { return aBroadcasterDescriptor.iCount; }
  // The record at `index` (bounds-checked by the array).
  RavelCBroadcasterDescriptor* GetBroadcaster(int index) { return aBroadcasterDescriptor[index]; }

  unsigned char bBroadcasterViewPropriety = 0;
  unsigned short iFirstDescriptorsLength = 0;  // 12 bits
  RavelCArray<RavelCBroadcasterDescriptor*> aBroadcasterDescriptor;  // section order, owned
};

#endif

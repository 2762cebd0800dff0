// Partial reception descriptor (tag 0xFB, ARIB STD-B10 / ABNT NBR 15603-2,
// partial_reception_descriptor):
//   { service_id 16 } ...
// Only the high byte of each service_id is kept (see ParseRawData).
#ifndef RAVEL_CDESCRIPTORPARTIALRECEPTION_H
#define RAVEL_CDESCRIPTORPARTIALRECEPTION_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorBase.h"

class RavelCPartialReceptionDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCPartialReceptionDescriptor(unsigned char* raw);
  RavelCPartialReceptionDescriptor(RavelCPartialReceptionDescriptor& other);
  RavelCPartialReceptionDescriptor& operator=(RavelCPartialReceptionDescriptor& other);
  virtual ~RavelCPartialReceptionDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetServiceIdCount() const { return aServiceIds.iCount; }
  // The stored id, or 0xFFFF for an index at or above the count.
  unsigned short GetServiceId(int index);

  RavelCArray<unsigned short> aServiceIds;  // the high byte of each broadcast service_id
};

#endif

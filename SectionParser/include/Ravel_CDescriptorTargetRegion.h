// Target region descriptor (tag 0xC6, ARIB STD-B10):
//   region_spec_type     8
//   target_region_spec   descriptor_length - 1 bytes, kept as they are
#ifndef RAVEL_CDESCRIPTORTARGETREGION_H
#define RAVEL_CDESCRIPTORTARGETREGION_H

#include "Ravel_CDescriptorBase.h"

class RavelCTargetRegionDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCTargetRegionDescriptor(unsigned char* raw);
  RavelCTargetRegionDescriptor(RavelCTargetRegionDescriptor& other);
  RavelCTargetRegionDescriptor& operator=(RavelCTargetRegionDescriptor& other);
  virtual ~RavelCTargetRegionDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  // Null when no descriptor has been parsed; always terminated.
  const char* GetRegionSpec() const { return pRegionSpec; }
  unsigned char GetRegionSpecType() const { return iRegionSpecType; }

  // malloc'd, (length - 1) mod 256 + 1 bytes: the region bytes and a closing 0.
  char* pRegionSpec = 0;
  unsigned char iRegionSpecType = 0;

 private:
  void Release();
};

#endif

// Module link descriptor (tag 0x04) of a DII module info, ARIB STD-B24 Vol. 3 /
// ABNT NBR 15606-3 data carousel:
//   position 8 | moduleId 16
#ifndef RAVEL_CDESCRIPTORMODULELINK_H
#define RAVEL_CDESCRIPTORMODULELINK_H

#include "Ravel_CDescriptorBase.h"

class RavelCModuleLinkDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCModuleLinkDescriptor(unsigned char* raw);
  RavelCModuleLinkDescriptor(RavelCModuleLinkDescriptor& other);
  RavelCModuleLinkDescriptor& operator=(RavelCModuleLinkDescriptor& other);
  virtual ~RavelCModuleLinkDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetPosition() const { return iPosition; }
  unsigned short GetModuleId() const { return iModuleId; }

  unsigned char iPosition = 0;
  unsigned short iModuleId = 0;
};

#endif

// Data component descriptor (tag 0xFD, ARIB STD-B10, ABNT NBR 15608):
//   data_component_id                 16
//   additional_data_component_info    (not read)
#ifndef RAVEL_CDESCRIPTORDATACOMPONENT_H
#define RAVEL_CDESCRIPTORDATACOMPONENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCDataComponentDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCDataComponentDescriptor(unsigned char* raw);
  RavelCDataComponentDescriptor(RavelCDataComponentDescriptor& other);
  RavelCDataComponentDescriptor& operator=(RavelCDataComponentDescriptor& other);
  virtual ~RavelCDataComponentDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned short GetDataComponentId() const { return iDataComponentId; }

  unsigned short iDataComponentId = 0;
};

#endif

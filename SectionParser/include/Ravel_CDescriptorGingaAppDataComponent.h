// Ginga application data component descriptor (data_component_descriptor, tag
// 0xFD, for a Ginga application; ABNT NBR 15606-3):
//   data_component_id 16
//   additional_data_component_info: the additional Ginga information
// The descriptor keeps the name "Unknown Descriptor" and dumps with the base
// line only. Its parse traces every value it reads, at the information level.
#ifndef RAVEL_CDESCRIPTORGINGAAPPDATACOMPONENT_H
#define RAVEL_CDESCRIPTORGINGAAPPDATACOMPONENT_H

#include "Ravel_CAdditionalGingaInfo.h"
#include "Ravel_CDescriptorBase.h"

class RavelCGingaAppDataComponentDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCGingaAppDataComponentDescriptor(unsigned char* raw);
  RavelCGingaAppDataComponentDescriptor(RavelCGingaAppDataComponentDescriptor& other);
  RavelCGingaAppDataComponentDescriptor& operator=(RavelCGingaAppDataComponentDescriptor& other);
  virtual ~RavelCGingaAppDataComponentDescriptor();

  virtual int ParseRawData(unsigned char* raw);

  unsigned short GetDataComponentId() const { return iDataComponentId; }
  RavelCAdditionalGingaInfo* GetAdditionalGingaInfo() const { return pAdditionalGingaInfo; }

  unsigned short iDataComponentId = 0;
  RavelCAdditionalGingaInfo* pAdditionalGingaInfo = 0;  // owned; null until a successful parse

 private:
  void Release();
};

#endif

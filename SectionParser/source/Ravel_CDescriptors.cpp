#include "Ravel_CDescriptors.h"

#include <cstring>

#include "Ravel_CDescriptorCRC32.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorCompressionType.h"
#include "Ravel_CDescriptorDataComponent.h"
#include "Ravel_CDescriptorEstDownloadTime.h"
#include "Ravel_CDescriptorInfo.h"
#include "Ravel_CDescriptorLinkage.h"
#include "Ravel_CDescriptorLocation.h"
#include "Ravel_CDescriptorModuleLink.h"
#include "Ravel_CDescriptorName.h"
#include "Ravel_CDescriptorNetworkName.h"
#include "Ravel_CDescriptorServiceList.h"
#include "Ravel_CDescriptorStreamIdentifier.h"
#include "Ravel_CDescriptorSystemManagement.h"
#include "Ravel_CDescriptorTSInformation.h"
#include "Ravel_CDescriptorTerrDeliverySystem.h"
#include "Ravel_CDescriptorType.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptors");

namespace {

template <class T>
RavelCDescriptorBase* Create(unsigned char* raw) {
  return new T(raw);
}

// The copy starts as an empty object of the class. A source that this class's
// parse accepted carries the class's display name: it is of this class and is
// copied whole. Any other source (a failed parse whose header holds a foreign
// tag, possibly of another class) has no fields of this class to give, so only
// its header is copied and the class fields stay empty.
template <class T>
RavelCDescriptorBase* Copy(RavelCDescriptorBase* source) {
  T* copy = new T(0);
  if (std::strcmp(source->GetDescriptorName(), T::kKind.szDisplayName) == 0) {
    *copy = *static_cast<T*>(source);
  } else {
    copy->RavelCDescriptorBase::operator=(*source);
  }
  return copy;
}

struct DescriptorClass {
  unsigned char iTag;
  RavelCDescriptorBase* (*Create)(unsigned char* raw);
  RavelCDescriptorBase* (*Copy)(RavelCDescriptorBase* source);
};

#define RAVEL_DESCRIPTOR_CLASS(tag, T) \
  { tag, &Create<T>, &Copy<T> }

const DescriptorClass kDescriptorClasses[] = {
    RAVEL_DESCRIPTOR_CLASS(0x01, RavelCTypeDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x02, RavelCNameDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x03, RavelCInfoDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x04, RavelCModuleLinkDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x05, RavelCCRC32Descriptor),
    RAVEL_DESCRIPTOR_CLASS(0x06, RavelCLocationDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x07, RavelCEstDownloadTimeDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x40, RavelCNetworkNameDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x41, RavelCServiceListDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x4A, RavelCLinkageDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x50, RavelCComponentDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0x52, RavelCStreamIdentifierDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0xC2, RavelCCompressionTypeDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0xCD, RavelCTSInformationDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0xFA, RavelCTerrDeliverySystemDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0xFD, RavelCDataComponentDescriptor),
    RAVEL_DESCRIPTOR_CLASS(0xFE, RavelCSystemManagementDescriptor),
};

const DescriptorClass* FindClass(unsigned char tag) {
  for (unsigned int i = 0; i < sizeof(kDescriptorClasses) / sizeof(kDescriptorClasses[0]); ++i) {
    if (kDescriptorClasses[i].iTag == tag) return &kDescriptorClasses[i];
  }
  return 0;
}

}  // namespace

RavelCDescriptorBase* RavelSM_GetDescriptor(unsigned char* raw) {
  if (raw == 0) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "RavelSM_GetDescriptor: apRawData is NULL!\n");
    return 0;
  }
  const unsigned char tag = RavelCReadWindow::Read8(raw);
  const DescriptorClass* descriptorClass = FindClass(tag);
  if (descriptorClass == 0) {
    // Unsupported descriptors are normal in broadcast data: informational only.
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "Unsupoorted descriptor. Tag=[0x%x]\n", tag);
    return 0;
  }
  return descriptorClass->Create(raw);
}

RavelCDescriptorBase* RavelSM_CopyDescriptor(RavelCDescriptorBase* source) {
  if (source == 0) return 0;
  const unsigned char tag = source->GetDescriptorTag();
  const DescriptorClass* descriptorClass = FindClass(tag);
  if (descriptorClass == 0) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Unknown Descriptor Tag. Tag=[%d]\n", tag);
    return 0;
  }
  return descriptorClass->Copy(source);
}

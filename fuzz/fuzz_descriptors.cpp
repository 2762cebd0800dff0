// Descriptors: the factory and copier offered to the caller, and every
// descriptor class on its own, over a descriptor followed by zeroes, as a
// descriptor that ends a section reads beyond it. The first byte chooses the class
// (0: the factory, 1: every class that takes the descriptor's tag, then one
// class each) and, with its top bit, the Japanese rules of the broadcast
// standard setting. Parsed descriptors are copied, assigned and dumped.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

#include "FuzzSupport.h"
#include "Ravel_Cfg.h"
#include "Ravel_CDescriptors.h"
#include "Ravel_CDescriptorApplication.h"
#include "Ravel_CDescriptorApplicationName.h"
#include "Ravel_CDescriptorAudioComponent.h"
#include "Ravel_CDescriptorCRC32.h"
#include "Ravel_CDescriptorComponent.h"
#include "Ravel_CDescriptorCompressionType.h"
#include "Ravel_CDescriptorContent.h"
#include "Ravel_CDescriptorCopyright.h"
#include "Ravel_CDescriptorCountryAvailability.h"
#include "Ravel_CDescriptorDataComponent.h"
#include "Ravel_CDescriptorEstDownloadTime.h"
#include "Ravel_CDescriptorExtendedBroadcaster.h"
#include "Ravel_CDescriptorExtendedEvent.h"
#include "Ravel_CDescriptorGeneralEvent.h"
#include "Ravel_CDescriptorGingaApp.h"
#include "Ravel_CDescriptorGingaAppDataComponent.h"
#include "Ravel_CDescriptorGingaAppLoc.h"
#include "Ravel_CDescriptorInfo.h"
#include "Ravel_CDescriptorLinkage.h"
#include "Ravel_CDescriptorLocalTimeOffset.h"
#include "Ravel_CDescriptorLocation.h"
#include "Ravel_CDescriptorLogoTransmission.h"
#include "Ravel_CDescriptorModuleLink.h"
#include "Ravel_CDescriptorNPTReference.h"
#include "Ravel_CDescriptorName.h"
#include "Ravel_CDescriptorNetworkName.h"
#include "Ravel_CDescriptorParentalRating.h"
#include "Ravel_CDescriptorPartialReception.h"
#include "Ravel_CDescriptorSeries.h"
#include "Ravel_CDescriptorService.h"
#include "Ravel_CDescriptorServiceList.h"
#include "Ravel_CDescriptorShortEvent.h"
#include "Ravel_CDescriptorStreamIdentifier.h"
#include "Ravel_CDescriptorSystemManagement.h"
#include "Ravel_CDescriptorTSInformation.h"
#include "Ravel_CDescriptorTargetRegion.h"
#include "Ravel_CDescriptorTerrDeliverySystem.h"
#include "Ravel_CDescriptorType.h"

namespace {

struct DescriptorClass {
  const RavelCDescriptorKind* pKind;
  void (*Use)(unsigned char* raw);
};

template <class T>
void UseClass(unsigned char* raw) {
  T descriptor(raw);
  descriptor.Show();
  T copy(descriptor);
  copy.Show();
  T assigned(0);
  assigned = descriptor;
  assigned.ParseRawData(raw);
  assigned.Show();
}

#define RAVEL_FUZZ_CLASS(T) \
  { &T::kKind, &UseClass<T> }

const DescriptorClass kClasses[] = {
    RAVEL_FUZZ_CLASS(RavelCApplicationDescriptor),
    RAVEL_FUZZ_CLASS(RavelCApplicationNameDescriptor),
    RAVEL_FUZZ_CLASS(RavelCAudioComponentDescriptor),
    RAVEL_FUZZ_CLASS(RavelCCRC32Descriptor),
    RAVEL_FUZZ_CLASS(RavelCComponentDescriptor),
    RAVEL_FUZZ_CLASS(RavelCCompressionTypeDescriptor),
    RAVEL_FUZZ_CLASS(RavelCContentDescriptor),
    RAVEL_FUZZ_CLASS(RavelCCopyrightDescriptor),
    RAVEL_FUZZ_CLASS(RavelCCountryAvailabilityDescriptor),
    RAVEL_FUZZ_CLASS(RavelCDataComponentDescriptor),
    RAVEL_FUZZ_CLASS(RavelCEstDownloadTimeDescriptor),
    RAVEL_FUZZ_CLASS(RavelCExtendedBroadcasterDescriptor),
    RAVEL_FUZZ_CLASS(RavelCExtendedEventDescriptor),
    RAVEL_FUZZ_CLASS(RavelCGeneralEventDescriptor),
    RAVEL_FUZZ_CLASS(RavelCGingaAppDescriptor),
    RAVEL_FUZZ_CLASS(RavelCGingaAppDataComponentDescriptor),
    RAVEL_FUZZ_CLASS(RavelCGingaAppLocDescriptor),
    RAVEL_FUZZ_CLASS(RavelCInfoDescriptor),
    RAVEL_FUZZ_CLASS(RavelCLinkageDescriptor),
    RAVEL_FUZZ_CLASS(RavelCLocalTimeOffsetDescriptor),
    RAVEL_FUZZ_CLASS(RavelCLocationDescriptor),
    RAVEL_FUZZ_CLASS(RavelCLogoTransmissionDescriptor),
    RAVEL_FUZZ_CLASS(RavelCModuleLinkDescriptor),
    RAVEL_FUZZ_CLASS(RavelCNPTReferenceDescriptor),
    RAVEL_FUZZ_CLASS(RavelCNameDescriptor),
    RAVEL_FUZZ_CLASS(RavelCNetworkNameDescriptor),
    RAVEL_FUZZ_CLASS(RavelCParentalRatingDescriptor),
    RAVEL_FUZZ_CLASS(RavelCPartialReceptionDescriptor),
    RAVEL_FUZZ_CLASS(RavelCSeriesDescriptor),
    RAVEL_FUZZ_CLASS(RavelCServiceDescriptor),
    RAVEL_FUZZ_CLASS(RavelCServiceListDescriptor),
    RAVEL_FUZZ_CLASS(RavelCShortEventDescriptor),
    RAVEL_FUZZ_CLASS(RavelCStreamIdentifierDescriptor),
    RAVEL_FUZZ_CLASS(RavelCSystemManagementDescriptor),
    RAVEL_FUZZ_CLASS(RavelCTSInformationDescriptor),
    RAVEL_FUZZ_CLASS(RavelCTargetRegionDescriptor),
    RAVEL_FUZZ_CLASS(RavelCTerrDeliverySystemDescriptor),
    RAVEL_FUZZ_CLASS(RavelCTypeDescriptor),
};

const unsigned int kClassCount = sizeof(kClasses) / sizeof(kClasses[0]);

void UseFactory(unsigned char* raw) {
  RavelCDescriptorBase* descriptor = RavelSM_GetDescriptor(raw);
  if (descriptor == 0) return;
  descriptor->Show();
  RavelCDescriptorBase* copy = RavelSM_CopyDescriptor(descriptor);
  if (copy != 0) {
    copy->Show();
    delete copy;
  }
  delete descriptor;
}

// Zeroes after the descriptor: more than any length or offset a descriptor holds can reach.
const int kZeroes = 65536;

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fuzz::SilenceTraces();
  if (size < 1) return 0;
  RavelCfg_SetStandard((data[0] & 0x80) ? 1 : 0);
  // tag 8 | length 8 | at most 255 bytes, then zeroes.
  std::vector<unsigned char> raw(2 + 255 + kZeroes, 0);
  std::memcpy(raw.data(), data + 1, size - 1 < 257 ? size - 1 : 257);
  unsigned int choice = (data[0] & 0x7F) % (kClassCount + 2);
  if (choice == 0) {
    UseFactory(raw.data());
  } else if (choice == 1) {
    for (unsigned int i = 0; i < kClassCount; ++i) {
      if (kClasses[i].pKind->iTag == raw[0]) kClasses[i].Use(raw.data());
    }
  } else {
    kClasses[choice - 2].Use(raw.data());
  }
  return 0;
}

// Network information table (table_id 0x40 actual, 0x41 other; ARIB STD-B10 5.2.4,
// ABNT NBR 15603-2), after the long section header (table id extension = network_id):
//   reserved 4 | network_descriptors_length 12 | network descriptors
//   reserved 4 | transport_stream_loop_length 12
//   transport stream loop:
//     transport_stream_id 16 | original_network_id 16
//     reserved 4 | transport_descriptors_length 12 | transport descriptors
//   CRC_32
// Kept from the network loop: linkage (0x4A), network name (0x40) and system
// management (0xFE); from each transport stream: service list (0x41), TS
// information (0xCD), terrestrial delivery system (0xFA), partial reception (0xFB).
#ifndef RAVEL_CTABLENIT_H
#define RAVEL_CTABLENIT_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorLinkage.h"
#include "Ravel_CDescriptorNetworkName.h"
#include "Ravel_CDescriptorPartialReception.h"
#include "Ravel_CDescriptorServiceList.h"
#include "Ravel_CDescriptorSystemManagement.h"
#include "Ravel_CDescriptorTSInformation.h"
#include "Ravel_CDescriptorTerrDeliverySystem.h"
#include "Ravel_CTableBase.h"

// One transport stream of the NIT's transport stream loop.
class RavelCTSInfo {
 public:
  explicit RavelCTSInfo(unsigned char* entry);
  RavelCTSInfo(RavelCTSInfo& other);
  RavelCTSInfo& operator=(RavelCTSInfo& other);
  virtual ~RavelCTSInfo();

  // Null clears the three scalars and gives -8; a descriptor with tag 0 or
  // length 0 clears everything and gives -24.
  virtual int ParseRawData(unsigned char* entry);
  virtual void Show();

  unsigned short GetTransportStreamId() const { return iTransportStreamId; }
  unsigned short GetOriginalNetworkId() const { return iOriginalNetworkId; }
  RavelCServiceListDescriptor* GetServiceList() { return pServiceList; }
  RavelCTerrDeliverySystemDescriptor* GetTerrDeliverySystem() { return pTerrDeliverySystem; }
  RavelCTSInformationDescriptor* GetTSInformation() { return pTSInformation; }
  RavelCPartialReceptionDescriptor* GetPartialReception() { return pPartialReception; }

  unsigned short iTransportStreamId = 0;
  unsigned short iOriginalNetworkId = 0;
  unsigned short iTransportDescriptorsLength = 0;  // 12 bits
  RavelCServiceListDescriptor* pServiceList = 0;                // owned, or null
  RavelCTerrDeliverySystemDescriptor* pTerrDeliverySystem = 0;  // owned, or null
  RavelCTSInformationDescriptor* pTSInformation = 0;            // owned, or null
  RavelCPartialReceptionDescriptor* pPartialReception = 0;      // owned, or null

 private:
  void DeleteDescriptors();
};

class RavelCNIT : public RavelCTableBase {
 public:
  explicit RavelCNIT(unsigned char* section);
  RavelCNIT(RavelCNIT& other);
  RavelCNIT& operator=(RavelCNIT& other);
  virtual ~RavelCNIT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  // Same version: takes each network descriptor this table lacks and appends a
  // copy of every transport stream of `other`. Another version: a trace, no change.
  RavelCNIT& operator+=(RavelCNIT& other);

  RavelCLinkageDescriptor* GetLinkage() { return pLinkage; }
  RavelCNetworkNameDescriptor* GetNetworkName() { return pNetworkName; }
  RavelCSystemManagementDescriptor* GetSystemManagement() { return pSystemManagement; }
  int GetTSInfoCount() const { return aTSInfoList.iCount; }
  // The transport stream at `index` (bounds-checked by the array).
  RavelCTSInfo* GetTSInfo(int index) { return aTSInfoList[index]; }

  RavelCLinkageDescriptor* pLinkage = 0;                    // owned, or null
  RavelCNetworkNameDescriptor* pNetworkName = 0;            // owned, or null
  RavelCSystemManagementDescriptor* pSystemManagement = 0;  // owned, or null
  RavelCArray<RavelCTSInfo*> aTSInfoList;               // section order, owned

 private:
  void DeleteNetworkDescriptors();
};

#endif

// Service description table (table_id 0x42 actual, 0x46 other; ARIB STD-B10,
// ABNT NBR 15603-2), after the long section header (table id extension =
// transport_stream_id):
//   original_network_id 16 (only its upper byte is kept)
//   reserved_future_use 8
//   services, up to the CRC_32:
//     service_id 16
//     reserved_future_use 3 | EIT_user_defined_flags 3    // xxx..... ...xxx..
//     EIT_schedule_flag 1 | EIT_present_following_flag 1  // ......x. .......x
//     running_status 3 | free_CA_mode 1                    // xxx..... ...x....
//     descriptors_loop_length 12                           // ....xxxx xxxxxxxx
//     descriptors (descriptors_loop_length bytes)
//   CRC_32
// Kept descriptors: service (0x48), country availability (0x49) and logo
// transmission (0xCF); the others are traced and skipped. A malformed descriptor
// loop of any service fails the whole section.
#ifndef RAVEL_CTABLESDT_H
#define RAVEL_CTABLESDT_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorCountryAvailability.h"
#include "Ravel_CDescriptorLogoTransmission.h"
#include "Ravel_CDescriptorService.h"
#include "Ravel_CTableBase.h"

// One service of the SDT.
class RavelCServiceDescription {
 public:
  // Cleared, then parsed from the entry (null leaves it cleared).
  explicit RavelCServiceDescription(unsigned char* entry);
  RavelCServiceDescription(RavelCServiceDescription& other);
  RavelCServiceDescription& operator=(RavelCServiceDescription& other);
  virtual ~RavelCServiceDescription();

  // Reads one service and its descriptors: null gives -8; a descriptor with tag
  // 0 or length 0 clears the service and gives -24.
  virtual int ParseRawData(unsigned char* entry);
  virtual void Show();

  unsigned short GetServiceId() const { return iServiceId; }
  unsigned char GetEITCompanyDefFlag() const { return iEITCompanyDefFlag; }
  unsigned char GetEITScheduleFlag() const { return bEITScheduleFlag; }
  unsigned char GetEITPresentFollowingFlag() const { return bEITPresentFollowingFlag; }
  unsigned char GetRunningStatus() const { return iRunningStatus; }
  unsigned char GetFreeCAMode() const { return bFreeCAMode; }
  unsigned short GetDescriptorsLoopLength() const { return iDescriptorsLoopLength; }
  RavelCServiceDescriptor* GetService() { return pService; }
  RavelCLogoTransmissionDescriptor* GetLogoTransmission() { return pLogoTransmission; }
  RavelCCountryAvailabilityDescriptor* GetCountryAvailability() { return pCountryAvailability; }

  unsigned short iServiceId = 0;
  unsigned char iEITCompanyDefFlag = 0;  // EIT_user_defined_flags, 3 bits
  unsigned char bEITScheduleFlag = 0;
  unsigned char bEITPresentFollowingFlag = 0;
  unsigned char iRunningStatus = 0;  // 3 bits
  unsigned char bFreeCAMode = 0;
  unsigned short iDescriptorsLoopLength = 0;  // 12 bits
  RavelCServiceDescriptor* pService = 0;                          // owned, or null
  RavelCLogoTransmissionDescriptor* pLogoTransmission = 0;        // owned, or null
  RavelCCountryAvailabilityDescriptor* pCountryAvailability = 0;  // owned, or null

 private:
  void ClearScalars();
  void DeleteDescriptors();
};

class RavelCSDT : public RavelCTableBase {
 public:
  explicit RavelCSDT(unsigned char* section);
  RavelCSDT(RavelCSDT& other);
  // Copies the header, name, original network id and every service.
  RavelCSDT& operator=(RavelCSDT& other);
  // Appends copies of the other's services when the versions match.
  RavelCSDT& operator+=(RavelCSDT& other);
  virtual ~RavelCSDT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  unsigned short GetOriginalNetworkId() const { return iOriginalNetworkId; }
  int GetServiceCount() const { return aServiceList.iCount; }
  // The service at `index` of the list (bounds-checked by the array).
  RavelCServiceDescription* GetServiceDescription(int index) { return aServiceList[index]; }

  // The upper byte of original_network_id alone (0x0640 is kept as 0x0006):
  // receivers compare against this value as the table has always stored it.
  unsigned short iOriginalNetworkId = 0;
  RavelCArray<RavelCServiceDescription*> aServiceList;  // the services in section order, owned

 private:
  void DeleteServices();
};

#endif

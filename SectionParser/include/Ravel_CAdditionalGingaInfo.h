// Additional Ginga information of the Ginga application data component
// descriptor (additional_data_component_info; ABNT NBR 15606-3):
//   transmission_format 2 | application_identifier_flag 1 | document_resolution 4
//   | independent_flag 1                                     // ttardddi
//   if application_identifier_flag: organization_id 32 | application_id 16
//   if transmission_format == 2: object carousel transmission format
// Owns its carousel record.
#ifndef RAVEL_CADDITIONALGINGAINFO_H
#define RAVEL_CADDITIONALGINGAINFO_H

#include "Ravel_CObjectCarouselTransmissionFormat.h"

class RavelCAdditionalGingaInfo {
 public:
  RavelCAdditionalGingaInfo();
  RavelCAdditionalGingaInfo(const RavelCAdditionalGingaInfo& other);
  RavelCAdditionalGingaInfo& operator=(const RavelCAdditionalGingaInfo& other);
  ~RavelCAdditionalGingaInfo();

  // Decodes from the flags byte, tracing each value; creates the carousel record
  // for transmission format 2 only. Null gives -8 and a cleared record.
  int ParseRawData(const unsigned char* raw);

  unsigned char GetTransmissionFormat() const { return iTransmissionFormat; }
  unsigned char GetApplicationIdentifierFlag() const { return bApplicationIdentifierFlag; }
  unsigned char GetDocumentResolution() const { return iDocumentResolution; }
  unsigned char GetIndependentFlag() const { return bIndependentFlag; }
  unsigned short GetApplicationIdentifierAppId() const { return iApplicationIdentifierAppId; }
  RavelCObjectCarouselTransmissionFormat* GetData() const { return pData; }

  unsigned char iTransmissionFormat;
  unsigned char bApplicationIdentifierFlag;
  unsigned char iDocumentResolution;
  unsigned char bIndependentFlag;
  unsigned int iApplicationIdentifierOrgId;
  unsigned short iApplicationIdentifierAppId;
  RavelCObjectCarouselTransmissionFormat* pData = 0;  // owned; null unless transmission format 2

 private:
  void Clear();
};

#endif

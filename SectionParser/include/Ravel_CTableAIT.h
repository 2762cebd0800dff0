// Application information table (table_id 0x74; ABNT NBR 15606-3, after ETSI TS
// 102 812), one section:
//   common section header, 8 bytes; table_id_extension = application_type
//   reserved 4 | common_descriptors_length 12 | common descriptors (not read)
//   reserved 4 | application_loop_length 12
//   application loop:
//     organization_id 32 | application_id 16 | application_control_code 8
//     document resolution 4 (reserved by the standard)       // rrrrxxxx
//     application_descriptors_loop_length 12 | application descriptors
//   CRC_32
// Each application becomes a GingaAITApplicationType with its name, path and file
// name taken from its descriptors. Every section stands alone: copies carry no
// applications and the merge adds none.
#ifndef RAVEL_CTABLEAIT_H
#define RAVEL_CTABLEAIT_H

#include "Ravel_CArray.h"
#include "Ravel_CTableBase.h"

// One application of the application loop. A plain record, copied as a block.
// The texts are copied into the cleared record without a terminator of their
// own; a text that fills its field (255 bytes) has none.
struct GingaAITApplicationType {
  unsigned int iOrganizationId;
  unsigned int iApplicationId;          // 16 significant bits
  unsigned int iApplicationControlCode;  // 8 significant bits
  char szAppName[255];      // application name descriptor
  char szAppFilePath[255];  // Ginga application location: base directory
  char szAppFileName[256];  // Ginga application location: initial class name
  int iDocumentResolution;  // 1 (code 0xC), 2 (0xB), 3 (0x0), else 0
};

class RavelCAIT : public RavelCTableBase {
 public:
  RavelCAIT();
  // Copy the header and the name only: the applications are not copied.
  RavelCAIT(RavelCAIT& other);
  RavelCAIT& operator=(RavelCAIT& other);
  virtual ~RavelCAIT();

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  // Merges nothing; traces when the versions differ.
  RavelCAIT& operator+=(RavelCAIT& other);

  // The table's own list, refilled by every parse.
  RavelCArray<GingaAITApplicationType>* GetApplicationList();

  // Takes what the record needs from one application descriptor.
  void processDescriptors(unsigned char* descriptor, GingaAITApplicationType* record);

  RavelCArray<GingaAITApplicationType> aApplicationList;
};

#endif

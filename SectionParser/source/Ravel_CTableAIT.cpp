#include "Ravel_CTableAIT.h"

#include <cstring>

#include "Ravel_CBitInputStream.h"
#include "Ravel_CDescriptorApplication.h"
#include "Ravel_CDescriptorApplicationName.h"
#include "Ravel_CDescriptorGingaApp.h"
#include "Ravel_CDescriptorGingaAppLoc.h"
#include "Ravel_FixedText.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"
#include "Ravel_Util.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CTableAIT");

namespace {

const unsigned char kAitTableId = 0x74;
// organization_id, application_id, application_control_code, the resolution
// nibble and application_descriptors_loop_length.
const int kApplicationFixedSize = 9;

// What each application descriptor tag is reported as; every other tag is an
// invalid descriptor.
struct AitDescriptorName {
  unsigned char iTag;
  const char* szDetected;
};

const AitDescriptorName kDescriptorNames[] = {
    {0x00, "Detected an APPLICATION_DESCRIPTOR"},
    {0x01, "Detected an APPLICATION_NAME_DESCRIPTOR"},
    {0x02, "Detected an APPLICATION_TRANSP_PROT_DESCRIPTOR"},
    {0x05, "Detected an APPLICATION_AUTH_EXT_DESCRIPTOR"},
    {0x06, "Detected an APPLICATION_GINGA_APP_DESCRIPTOR"},
    {0x07, "Detected an APPLICATION_GINGA_APP_LOCATION_DESCRIPTOR"},
    {0x0B, "Detected an APPLICATION_ICON_DESCRIPTOR"},
    {0x0C, "Detected an APPLICATION_PREFETCH_DESCRIPTOR"},
    {0x0D, "Detected an APPLICATION_DII_LOCATION_DESCRIPTOR"},
    {0xFD, "Detected an APPLICATION_DATA_COMPONENT_DESCRIPTOR"},
};

const char* DetectedName(unsigned char tag) {
  for (unsigned int i = 0; i < sizeof(kDescriptorNames) / sizeof(kDescriptorNames[0]); ++i) {
    if (kDescriptorNames[i].iTag == tag) return kDescriptorNames[i].szDetected;
  }
  return 0;
}

// The reserved nibble after the control code carries the document resolution.
int DocumentResolution(unsigned char code) {
  switch (code) {
    case 0xC:
      return 1;
    case 0xB:
      return 2;
    case 0x0:
      return 3;
    default:
      return 0;
  }
}

// Writes a descriptor's text over the start of a record field. The rest of the
// field keeps what an earlier descriptor of the same kind wrote there.
template <std::size_t FieldSize, std::size_t TextSize>
void CopyText(char (&field)[FieldSize], const char (&text)[TextSize]) {
  RavelFixedText_Write(field, FieldSize, text, RavelFixedText_Length(text, TextSize));
}

}  // namespace

RavelCAIT::RavelCAIT() : RavelCTableBase(0), aApplicationList() {}

RavelCAIT::RavelCAIT(RavelCAIT& other) : RavelCTableBase(0), aApplicationList() { CopyHeader(other); }

RavelCAIT& RavelCAIT::operator=(RavelCAIT& other) {
  CopyHeader(other);
  return *this;
}

RavelCAIT::~RavelCAIT() {}

RavelCArray<GingaAITApplicationType>* RavelCAIT::GetApplicationList() { return &aApplicationList; }

RavelCAIT& RavelCAIT::operator+=(RavelCAIT& other) {
  if (iVersionNumber != other.iVersionNumber) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Two AIT Information have different information!\n");
  }
  return *this;
}

int RavelCAIT::ParseRawData(unsigned char* section) {
  RavelCReadWindow window(section);
  aApplicationList.iCount = 0;  // records hold no resources
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "RavelCAIT::ParseRawData... apRawData=[%p]\n", static_cast<void*>(section));
  // A null section fails here as well: the CRC check refuses it.
  if (!RavelUtil_CheckSectionCRC32(section)) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "AIT Section: CRC Error!\n");
    return kRavelErrCorruptSection;
  }
  RavelCTableBase::ParseRawData(section);
  if (iTableId != kAitTableId) {
    RAVEL_TRACE(RAVEL_PARSER_ERROR, "Table ID isn't for AIT! Table ID=[0x%02x]\n", iTableId);
    return kRavelErrInvalidArgument;
  }

  // The two loop lengths are read one after the other, so application_loop_length
  // is taken from bytes 10-11 whatever common_descriptors_length says; the loop
  // itself is then looked for behind the common descriptors. A section too short
  // for the two lengths reads them as 0.
  int headerLength = static_cast<int>(iSectionLength) - 9;
  RavelCBitInputStream reader = RavelCReadWindow::Reader(section + 8, headerLength);
  unsigned char status = 0;
  reader.Skip(4);                                                  // rrrrxxxx
  unsigned short commonDescriptorsLength = reader.ReadShort(12, status);
  reader.Skip(4);                                                  // rrrrxxxx
  unsigned short applicationLoopLength = reader.ReadShort(12, status);
  if (applicationLoopLength < 1) return kRavelOk;

  // The loops stop at the end of the section whatever their lengths say.
  unsigned char* position = section + 12 + commonDescriptorsLength;
  const unsigned char* loopEnd = RavelCReadWindow::Clamp(position, position + applicationLoopLength);
  do {
    if (RavelCReadWindow::Unreadable(position)) break;
    GingaAITApplicationType record;
    std::memset(&record, 0, sizeof(record));
    RavelCBitInputStream entry = RavelCReadWindow::Reader(position, applicationLoopLength);
    record.iOrganizationId = entry.ReadInt(32, status);
    record.iApplicationId = entry.ReadShort(16, status);
    record.iApplicationControlCode = entry.ReadByte(8, status);
    unsigned char resolutionCode = entry.ReadByte(4, status);  // rrrrxxxx
    record.iDocumentResolution = DocumentResolution(resolutionCode);
    if (record.iDocumentResolution == 0) {
      RAVEL_TRACE(RAVEL_PARSER_ERROR, "Document resolution not supported!!\n");
    }
    unsigned short descriptorsLength = entry.ReadShort(12, status);  // xxxxllll llllllll
    position += kApplicationFixedSize;
    if (descriptorsLength >= 1) {
      const unsigned char* descriptorsEnd = RavelCReadWindow::Clamp(position, position + descriptorsLength);
      do {
        if (RavelCReadWindow::Unreadable(position)) break;
        processDescriptors(position, &record);
        position += RavelCReadWindow::Read8(position + 1) + 2;
      } while (position < descriptorsEnd);
    }
    aApplicationList.Append(record);
  } while (position < loopEnd);
  return kRavelOk;
}

void RavelCAIT::processDescriptors(unsigned char* descriptor, GingaAITApplicationType* record) {
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "RavelCAIT::processDescriptors...\n");
  unsigned char tag = descriptor[0];
  const char* detected = DetectedName(tag);
  if (detected == 0) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "Detected an Invalid Descriptor");
    return;
  }
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "%s", detected);
  switch (tag) {
    case 0x00: {
      RavelCApplicationDescriptor application(descriptor);  // decoded, nothing kept
      break;
    }
    case 0x01: {
      RavelCApplicationNameDescriptor name(descriptor);
      CopyText(record->szAppName, name.szApplicationName);
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Application name = %s", RavelFixedText_Print(record->szAppName).Get());
      break;
    }
    case 0x06: {
      RavelCGingaAppDescriptor gingaApplication(descriptor);  // decoded, nothing kept
      break;
    }
    case 0x07: {
      RavelCGingaAppLocDescriptor location(descriptor);
      CopyText(record->szAppFilePath, location.sBaseDirectory);
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Application path = %s", RavelFixedText_Print(record->szAppFilePath).Get());
      CopyText(record->szAppFileName, location.sInicialClassName);
      RAVEL_TRACE(RAVEL_PARSER_WARNING, "Application filename = %s",
                  RavelFixedText_Print(record->szAppFileName).Get());
      break;
    }
    default:
      break;  // reported only
  }
}

void RavelCAIT::Show() {
  static const char kRule[] = "#################################################################\n";
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "###################### AIT Table Information ######################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Header Information ########################\n");
  RavelCTableBase::Show();
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "####################### Body Information ########################\n");
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "%s", kRule);
  for (int i = 0; i < aApplicationList.iCount; ++i) {
    const GingaAITApplicationType& application = aApplicationList.ipArray[i];
    RAVEL_TRACE(RAVEL_PARSER_DUMP,
                "- - - - - - - - - - - - - - - - Application Information - - - - - - - - - - - - ");
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App Name.........: %s", RavelFixedText_Print(application.szAppName).Get());
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App File Path....: %s",
                RavelFixedText_Print(application.szAppFilePath).Get());
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App File Name....: %s",
                RavelFixedText_Print(application.szAppFileName).Get());
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App orgId........: %u", application.iOrganizationId);
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App appId........: %u", application.iApplicationId);
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t App control code.: %u", application.iApplicationControlCode);
    RAVEL_TRACE(RAVEL_PARSER_DUMP,
                "- - - - - - - - - - - - - - - End of Application Information - - - - - - - - - -");
  }
}

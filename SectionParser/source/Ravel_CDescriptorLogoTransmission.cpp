#include "Ravel_CDescriptorLogoTransmission.h"

#include <cstdlib>
#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorLogoTransmission");

const RavelCDescriptorKind RavelCLogoTransmissionDescriptor::kKind = {
    0xCF, "Logo Transmission Descriptor",
    "This Descriptor isn't LogoTransmission Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== LogoTransmission Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

namespace {

// The logo characters of a type-3 descriptor: the descriptor_length - 1 bytes
// after the type. The buffer is sized for the whole descriptor body plus one, and
// every byte after the characters is 0.
char* NewLogoCharacters(const unsigned char* text, int descriptorLength) {
  int count = descriptorLength > 0 ? descriptorLength - 1 : 0;
  std::size_t size = static_cast<std::size_t>(count) + 2;
  char* buffer = static_cast<char*>(std::malloc(size));
  if (buffer == 0) return 0;
  std::memset(buffer, 0, size);
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(buffer), text, count);
  return buffer;
}

// The copy made by assignment: like every owned text it is duplicated up to its
// first 0 byte. The buffer keeps the source's size, zero-filled, so that the
// copy still holds descriptor_length - 1 readable characters.
char* DuplicateLogoCharacters(const char* text, int descriptorLength) {
  int count = descriptorLength > 0 ? descriptorLength - 1 : 0;
  std::size_t size = static_cast<std::size_t>(count) + 2;
  char* buffer = static_cast<char*>(std::malloc(size));
  if (buffer == 0) return 0;
  std::memset(buffer, 0, size);
  std::size_t length = std::strlen(text);
  if (length > static_cast<std::size_t>(count)) length = static_cast<std::size_t>(count);
  std::memcpy(buffer, text, length);
  return buffer;
}

}  // namespace

RavelCLogoTransmissionDescriptor::RavelCLogoTransmissionDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCLogoTransmissionDescriptor::RavelCLogoTransmissionDescriptor(RavelCLogoTransmissionDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCLogoTransmissionDescriptor& RavelCLogoTransmissionDescriptor::operator=(
    RavelCLogoTransmissionDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iLogoTransmissionType = other.iLogoTransmissionType;
  iLogoId = other.iLogoId;
  iLogoVersion = other.iLogoVersion;
  iDownloadDataId = other.iDownloadDataId;
  if (other.pLogoCharacters != 0) {
    pLogoCharacters = DuplicateLogoCharacters(other.pLogoCharacters, other.iDescriptorLength);
  }
  return *this;
}

RavelCLogoTransmissionDescriptor::~RavelCLogoTransmissionDescriptor() { Release(); }

void RavelCLogoTransmissionDescriptor::Release() { RavelText_FreeCText(pLogoCharacters); }

int RavelCLogoTransmissionDescriptor::GetLogoCharactersLength() const {
  if (pLogoCharacters == 0 || iDescriptorLength == 0) return 0;
  return iDescriptorLength - 1;
}

int RavelCLogoTransmissionDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  // A refused descriptor keeps the type, ids and version it had.
  if (result != kRavelOk) return result;
  // A descriptor of another transmission type keeps nothing of an earlier one.
  iLogoId = 0;
  iLogoVersion = 0;
  iDownloadDataId = 0;
  iLogoTransmissionType = RavelCReadWindow::Read8(raw + 2);
  switch (iLogoTransmissionType) {
    case 1:
      iLogoId = RavelCReadWindow::Read16(raw + 3) & 0x01FF;       // -------x xxxxxxxx
      iLogoVersion = RavelCReadWindow::Read16(raw + 5) & 0x0FFF;  // ----xxxx xxxxxxxx
      iDownloadDataId = RavelCReadWindow::Read16(raw + 7);
      break;
    case 2:
      iLogoId = RavelCReadWindow::Read16(raw + 3) & 0x01FF;  // -------x xxxxxxxx
      break;
    case 3:
      pLogoCharacters = NewLogoCharacters(raw + 3, iDescriptorLength);
      break;
    default:
      break;
  }
  return kRavelOk;
}

void RavelCLogoTransmissionDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLogoTransmission Type=[0x%02x]\n", iLogoTransmissionType);
  if (iLogoTransmissionType == 3) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLogo Char String=[%s]\n", RavelTraceText(pLogoCharacters));
  } else {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLogo version=[%d]\n", iLogoVersion);
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tDownload ID=[%d]\n", iDownloadDataId);
  }
}

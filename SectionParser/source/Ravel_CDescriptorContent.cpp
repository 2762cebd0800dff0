#include "Ravel_CDescriptorContent.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorContent");

const RavelCDescriptorKind RavelCContentDescriptor::kKind = {
    0x54, "Content Descriptor", "This Descriptor isn't Content Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Content Descriptor =====================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCContentDescriptor::RavelCContentDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCContentDescriptor::RavelCContentDescriptor(RavelCContentDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCContentDescriptor& RavelCContentDescriptor::operator=(RavelCContentDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iGenreCount = other.iGenreCount;
  if (iGenreCount > 0 && other.pGenre != 0 && other.pUserGenre != 0) {
    pGenre = new unsigned char[iGenreCount];
    pUserGenre = new unsigned char[iGenreCount];
    std::memcpy(pGenre, other.pGenre, static_cast<std::size_t>(iGenreCount));
    std::memcpy(pUserGenre, other.pUserGenre, static_cast<std::size_t>(iGenreCount));
  }
  return *this;
}

RavelCContentDescriptor::~RavelCContentDescriptor() { Release(); }

void RavelCContentDescriptor::Release() {
  delete[] pGenre;
  pGenre = 0;
  delete[] pUserGenre;
  pUserGenre = 0;
  iGenreCount = 0;
}

int RavelCContentDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iGenreCount = iDescriptorLength >> 1;
  if (iDescriptorLength < 2) {
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "Empty Content Descriptor!\n");
    return kRavelOk;
  }
  pGenre = new unsigned char[iGenreCount];
  pUserGenre = new unsigned char[iGenreCount];
  for (int i = 0; i < iGenreCount; ++i) {
    pGenre[i] = RavelCReadWindow::Read8(raw + 2 + 2 * i);
    // Every genre is reported at warning level for the field diagnostics.
    RAVEL_TRACE(RAVEL_PARSER_WARNING, "raw genre = 0x%x!\n", pGenre[i]);
    pUserGenre[i] = RavelCReadWindow::Read8(raw + 3 + 2 * i);
  }
  return kRavelOk;
}

bool RavelCContentDescriptor::CheckIndex(int index) {
  if (index >= 0 && index < iGenreCount && pGenre != 0 && pUserGenre != 0) return true;
  RAVEL_TRACE(RAVEL_PARSER_WARNING, "Invalid Array Index! aIndex=[%d], array len=[%d]\n", index, iGenreCount);
  return false;
}

int RavelCContentDescriptor::GetGenre(int index, unsigned char& level1, unsigned char& level2) {
  if (!CheckIndex(index)) {
    level1 = 0;
    level2 = 0;
    return 0;
  }
  level1 = static_cast<unsigned char>(pGenre[index] >> 4);
  level2 = static_cast<unsigned char>(pGenre[index] & 0x0F);
  return 1;
}

unsigned char RavelCContentDescriptor::GetUserGenre(int index) {
  if (!CheckIndex(index)) return 0;
  return pUserGenre[index];
}

void RavelCContentDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  for (int i = 0; i < iGenreCount && pGenre != 0; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tGenre[%d]=[0x%02x]", i, pGenre[i]);
  }
}

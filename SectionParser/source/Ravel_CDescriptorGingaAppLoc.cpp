#include "Ravel_CDescriptorGingaAppLoc.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_FixedText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorGingaAppLoc");

// The application descriptors dump at the information level.
static const unsigned int kShowMask = RAVEL_PARSER_WARNING;

const RavelCDescriptorKind RavelCGingaAppLocDescriptor::kKind = {
    0x07, "Ginga Application Location Descriptor", 0 /* any tag */,
    "\t=================== Ginga Application Location Descriptor ===================\n", RAVEL_WRONG_TAG_MASK,
    false, kRavelTraceSourcePath};

RavelCGingaAppLocDescriptor::RavelCGingaAppLocDescriptor(unsigned char* raw) {
  Clear();
  ParseRawData(raw);
}

RavelCGingaAppLocDescriptor::RavelCGingaAppLocDescriptor(RavelCGingaAppLocDescriptor&) = default;

RavelCGingaAppLocDescriptor& RavelCGingaAppLocDescriptor::operator=(RavelCGingaAppLocDescriptor&) = default;

RavelCGingaAppLocDescriptor::~RavelCGingaAppLocDescriptor() {}

void RavelCGingaAppLocDescriptor::Clear() {
  std::memset(sBaseDirectory, 0, sizeof(sBaseDirectory));
  std::memset(sClassPath, 0, sizeof(sClassPath));
  std::memset(sInicialClassName, 0, sizeof(sInicialClassName));
}

int RavelCGingaAppLocDescriptor::ParseRawData(unsigned char* raw) {
  Clear();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  // Every count is 8 bits wide, so no text exceeds its 255-byte field.
  const unsigned char* position = raw + 2;
  unsigned char baseLength = RavelCReadWindow::Read8(position++);
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(sBaseDirectory), position, baseLength);
  position += baseLength;
  unsigned char classPathLength = RavelCReadWindow::Read8(position++);
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(sClassPath), position, classPathLength);
  position += classPathLength;
  // The rest of the descriptor; wraps modulo 256 when the two counts claim more
  // than the descriptor holds.
  unsigned char initialClassLength =
      static_cast<unsigned char>(iDescriptorLength - baseLength - classPathLength - 2);
  RavelCReadWindow::Copy(reinterpret_cast<unsigned char*>(sInicialClassName), position, initialClassLength);
  return kRavelOk;
}

void RavelCGingaAppLocDescriptor::Show() {
  ShowHeader(kKind, __LINE__, kShowMask);
  RAVEL_TRACE(kShowMask, "\t  sBaseDirectory = %s, sClassPath = %s, sInicialClassName = %s \n",
              RavelFixedText_Print(sBaseDirectory).Get(), RavelFixedText_Print(sClassPath).Get(),
              RavelFixedText_Print(sInicialClassName).Get());
}

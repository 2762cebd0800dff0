#include "Ravel_CDescriptorBase.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorBase");

RavelCDescriptorBase::RavelCDescriptorBase() : sDescriptorName() {
  RavelCDescriptorBase::ParseRawData(0);
}

RavelCDescriptorBase::RavelCDescriptorBase(const RavelCDescriptorBase& other)
    : iDescriptorTag(other.iDescriptorTag),
      iDescriptorLength(other.iDescriptorLength),
      sDescriptorName(other.sDescriptorName) {}

RavelCDescriptorBase& RavelCDescriptorBase::operator=(const RavelCDescriptorBase& other) {
  iDescriptorTag = other.iDescriptorTag;
  iDescriptorLength = other.iDescriptorLength;
  sDescriptorName = other.sDescriptorName;
  return *this;
}

RavelCDescriptorBase::~RavelCDescriptorBase() {}

int RavelCDescriptorBase::ParseRawData(unsigned char* raw) {
  if (raw == 0) {
    iDescriptorTag = 0;
    iDescriptorLength = 0;
    return kRavelErrInvalidArgument;
  }
  iDescriptorTag = RavelCReadWindow::Read8(raw);
  iDescriptorLength = RavelCReadWindow::Read8(raw + 1);
  sDescriptorName = "Unknown Descriptor";
  return kRavelOk;
}

void RavelCDescriptorBase::Show() {
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tDescriptor Tag=[0x%x], Descriptor Length=[%d], Name=[%s]\n", iDescriptorTag,
              iDescriptorLength, sDescriptorName.GetString());
}

// Traces of the shared steps are reported from the descriptor class's own
// source, at the line of its call.
#define RAVEL_TRACE_KIND(kind, line, mask, ...) RAVEL_PGL_TRACE_AT((kind).szSourcePath, (line), (mask), __VA_ARGS__)

int RavelCDescriptorBase::ParseHeader(unsigned char* raw, const RavelCDescriptorKind& kind, int sourceLine) {
  RavelCDescriptorBase::ParseRawData(raw);
  if (raw == 0) {
    if (kind.bTraceNullArgument) RAVEL_TRACE_KIND(kind, sourceLine, RAVEL_PARSER_ERROR, "Invalid Argument!\n");
    return kRavelErrInvalidArgument;
  }
  if (kind.szWrongTagFormat != 0 && iDescriptorTag != kind.iTag) {
    RAVEL_TRACE_KIND(kind, sourceLine, kind.iWrongTagMask, kind.szWrongTagFormat, iDescriptorTag);
    return kRavelErrInvalidArgument;
  }
  sDescriptorName = kind.szDisplayName;
  return kRavelOk;
}

void RavelCDescriptorBase::ShowHeader(const RavelCDescriptorKind& kind, int sourceLine, unsigned int mask) {
  RAVEL_TRACE_KIND(kind, sourceLine, mask, "%s", kind.szBanner);
  RavelCDescriptorBase::Show();
}

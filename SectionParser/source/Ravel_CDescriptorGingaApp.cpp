#include "Ravel_CDescriptorGingaApp.h"

#include <cstring>

#include "Ravel_FixedText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorGingaApp");

// The application descriptors dump at the information level.
static const unsigned int kShowMask = RAVEL_PARSER_WARNING;

const RavelCDescriptorKind RavelCGingaAppDescriptor::kKind = {
    0x06, "Ginga Application Descriptor", 0 /* any tag */,
    "\t=================== Ginga Application Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCGingaAppDescriptor::RavelCGingaAppDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCGingaAppDescriptor::RavelCGingaAppDescriptor(RavelCGingaAppDescriptor&) = default;

RavelCGingaAppDescriptor& RavelCGingaAppDescriptor::operator=(RavelCGingaAppDescriptor&) = default;

RavelCGingaAppDescriptor::~RavelCGingaAppDescriptor() {}

int RavelCGingaAppDescriptor::ParseRawData(unsigned char* raw) {
  if (raw == 0) std::memset(szParameter, 0, sizeof(szParameter));
  return ParseHeader(raw, kKind, __LINE__);
}

void RavelCGingaAppDescriptor::Show() {
  ShowHeader(kKind, __LINE__, kShowMask);
  RAVEL_TRACE(kShowMask, "\t iParameter %s \n", RavelFixedText_Print(szParameter).Get());
}

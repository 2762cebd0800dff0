#include "Ravel_CDescriptorService.h"

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorService");

const RavelCDescriptorKind RavelCServiceDescriptor::kKind = {
    0x48, "Service Descriptor", "This Descriptor isn't Service Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Service Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCServiceDescriptor::RavelCServiceDescriptor(unsigned char* raw) {
  ParseRawData(raw);
}

RavelCServiceDescriptor::RavelCServiceDescriptor(RavelCServiceDescriptor& other)
    : RavelCDescriptorBase(other) {
  *this = other;
}

RavelCServiceDescriptor& RavelCServiceDescriptor::operator=(RavelCServiceDescriptor& other) {
  RavelCDescriptorBase::operator=(other);
  iServiceType = other.iServiceType;
  Release();
  // The names are duplicated only into a name that is already set, which the
  // release above never leaves: a copied service descriptor carries no names.
  if (pServiceProviderName != 0) pServiceProviderName = RavelText_DuplicateCText(other.pServiceProviderName);
  if (pServiceName != 0) pServiceName = RavelText_DuplicateCText(other.pServiceName);
  return *this;
}

RavelCServiceDescriptor::~RavelCServiceDescriptor() { Release(); }

void RavelCServiceDescriptor::Release() {
  RavelText_FreeCText(pServiceProviderName);
  RavelText_FreeCText(pServiceName);
}

int RavelCServiceDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  iServiceType = RavelCReadWindow::Read8(raw + 2);
  const unsigned char* at = raw + 3;
  int providerLength = RavelCReadWindow::Read8(at);
  if (providerLength > 0) pServiceProviderName = RavelText_NewCText(at + 1, providerLength);
  at += 1 + providerLength;
  int nameLength = RavelCReadWindow::Read8(at);
  if (nameLength > 0) pServiceName = RavelText_NewCText(at + 1, nameLength);
  return kRavelOk;
}

void RavelCServiceDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tService Type=[0x%02x]\n", iServiceType);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tService Provider Name=[%s]\n", RavelTraceText(pServiceProviderName));
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tService Name=[%s]\n", RavelTraceText(pServiceName));
}

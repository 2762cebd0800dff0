#include "Ravel_CDescriptorExtendedBroadcaster.h"

#include <cstring>

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorExtendedBroadcaster");

const RavelCDescriptorKind RavelCExtendedBroadcasterDescriptor::kKind = {
    0xCE, "Extended Braodcaster Descriptor",
    "This Descriptor isn't Extended Broadcaster Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Extended Broadcaster Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCExtendedBroadcasterDescriptor::RavelCExtendedBroadcasterDescriptor(unsigned char* raw) {
  Release();
  ParseRawData(raw);
}

RavelCExtendedBroadcasterDescriptor::RavelCExtendedBroadcasterDescriptor(RavelCExtendedBroadcasterDescriptor&) = default;

RavelCExtendedBroadcasterDescriptor& RavelCExtendedBroadcasterDescriptor::operator=(RavelCExtendedBroadcasterDescriptor&) = default;

RavelCExtendedBroadcasterDescriptor::~RavelCExtendedBroadcasterDescriptor() {}

// The two id lists and their counts.
void RavelCExtendedBroadcasterDescriptor::Release() {
  iNumberOfAffiliationIds = 0;
  iNumberOfBroadcasterIds = 0;
  std::memset(aAffiliationIds, 0, sizeof(aAffiliationIds));
  std::memset(aOriginalNetworkIds, 0, sizeof(aOriginalNetworkIds));
  std::memset(aBroadcasterIds, 0, sizeof(aBroadcasterIds));
}

int RavelCExtendedBroadcasterDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  // A refused descriptor keeps the type and the broadcaster id it had.
  if (result != kRavelOk) return result;
  // A descriptor of another broadcaster type keeps nothing of an earlier one.
  iTerrestrialBroadcasterId = 0;
  iBroadcasterType = RavelCReadWindow::Read8(raw + 2) >> 4;  // xxxx----
  if (iBroadcasterType != 1 && iBroadcasterType != 2) return kRavelOk;

  // Types 1 and 2 share the layout: for type 2 the id is the sound broadcaster's.
  iTerrestrialBroadcasterId = RavelCReadWindow::Read16(raw + 3);
  iNumberOfAffiliationIds = RavelCReadWindow::Read8(raw + 5) >> 4;   // xxxx----
  iNumberOfBroadcasterIds = RavelCReadWindow::Read8(raw + 5) & 0x0F;  // ----xxxx
  const unsigned char* at = raw + 6;
  // The affiliation ids are taken from every second byte, while the loop after
  // them starts one byte per id further on. Receivers rely on these values as
  // they are, so both steps stay. The 4-bit counts keep every index below 16.
  for (int i = 0; i < iNumberOfAffiliationIds; ++i) aAffiliationIds[i] = RavelCReadWindow::Read8(at + 2 * i);
  at += iNumberOfAffiliationIds;
  for (int j = 0; j < iNumberOfBroadcasterIds; ++j) {
    aOriginalNetworkIds[j] = RavelCReadWindow::Read16(at + 3 * j);
    aBroadcasterIds[j] = RavelCReadWindow::Read8(at + 3 * j + 2);
  }
  return kRavelOk;
}

void RavelCExtendedBroadcasterDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tiBroadcasterType=[0x%x], Affiliation ID Nums=[%d], Broadcaster ID Nums=[%d]\n",
              iBroadcasterType, iNumberOfAffiliationIds, iNumberOfBroadcasterIds);
  for (int i = 0; i < iNumberOfAffiliationIds && i < kMaxIds; ++i) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\t[%d]th Affiliation Id=[%d]\n", i, aAffiliationIds[i]);
  }
  for (int j = 0; j < iNumberOfBroadcasterIds && j < kMaxIds; ++j) {
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\t\t[%d]th Org Network Id=[%d], Broadcaster ID=[%d]\n", j,
                aOriginalNetworkIds[j], aBroadcasterIds[j]);
  }
}

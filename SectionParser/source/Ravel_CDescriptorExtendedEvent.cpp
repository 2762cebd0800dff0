#include "Ravel_CDescriptorExtendedEvent.h"

#include <cstring>

#include "Ravel_CReadWindow.h"
#include "Ravel_DescriptorText.h"
#include "Ravel_RecordList.h"
#include "Ravel_ResultCode.h"
#include "Ravel_Trace.h"

RAVEL_TRACE_SOURCE("SectionParser/source/Ravel_CDescriptorExtendedEvent");

RavelCExtendedEvent::RavelCExtendedEvent(char* description, char* item)
    : pItemDescription(description), pItem(item) {}

RavelCExtendedEvent::RavelCExtendedEvent(const RavelCExtendedEvent& other)
    : pItemDescription(RavelText_DuplicateCText(other.pItemDescription)),
      pItem(RavelText_DuplicateCText(other.pItem)) {}

RavelCExtendedEvent& RavelCExtendedEvent::operator=(const RavelCExtendedEvent& other) {
  if (this == &other) return *this;
  RavelText_FreeCText(pItemDescription);
  RavelText_FreeCText(pItem);
  pItemDescription = RavelText_DuplicateCText(other.pItemDescription);
  pItem = RavelText_DuplicateCText(other.pItem);
  return *this;
}

RavelCExtendedEvent::~RavelCExtendedEvent() {
  RavelText_FreeCText(pItemDescription);
  RavelText_FreeCText(pItem);
}

const RavelCDescriptorKind RavelCExtendedEventDescriptor::kKind = {
    0x4E, "Extended Event Descriptor", "This Descriptor isn't Extended Event Descriptor! Descriptor Tag=[0x%x]\n",
    "\t=================== Extended Event Descriptor ===================\n", RAVEL_WRONG_TAG_MASK, false, kRavelTraceSourcePath};

RavelCExtendedEventDescriptor::RavelCExtendedEventDescriptor(unsigned char* raw)
    : aItems() {
  ParseRawData(raw);
}

RavelCExtendedEventDescriptor::RavelCExtendedEventDescriptor(RavelCExtendedEventDescriptor& other)
    : RavelCDescriptorBase(other), aItems() {
  *this = other;
}

RavelCExtendedEventDescriptor& RavelCExtendedEventDescriptor::operator=(RavelCExtendedEventDescriptor& other) {
  if (this == &other) return *this;
  Release();
  RavelCDescriptorBase::operator=(other);
  iDescriptorNumber = other.iDescriptorNumber;
  iLastDescriptorNumber = other.iLastDescriptorNumber;
  std::memcpy(szLanguageCode, other.szLanguageCode, sizeof(szLanguageCode));
  RavelRecordList_AppendCopies(aItems, other.aItems);
  pText = RavelText_DuplicateCText(other.pText);
  return *this;
}

RavelCExtendedEventDescriptor::~RavelCExtendedEventDescriptor() { Release(); }

void RavelCExtendedEventDescriptor::Release() {
  RavelRecordList_DeleteAll(aItems);
  RavelText_FreeCText(pText);
  iDescriptorNumber = 0;
  iLastDescriptorNumber = 0;
  std::memset(szLanguageCode, 0, sizeof(szLanguageCode));
}

int RavelCExtendedEventDescriptor::ParseRawData(unsigned char* raw) {
  Release();
  int result = ParseHeader(raw, kKind, __LINE__);
  if (result != kRavelOk) return result;
  const unsigned char numbers = RavelCReadWindow::Read8(raw + 2);
  iDescriptorNumber = static_cast<unsigned char>(numbers >> 4);        // xxxx....
  iLastDescriptorNumber = static_cast<unsigned char>(numbers & 0x0F);  // ....xxxx
  RavelText_SetLanguageCode(szLanguageCode, raw + 3);

  const int itemsLength = RavelCReadWindow::Read8(raw + 6);
  // The items stop at the end of the section too.
  const unsigned char* itemsEnd = RavelCReadWindow::Clamp(raw + 7, raw + 7 + itemsLength);
  int p = 7;
  if (raw + p < itemsEnd) {
    do {
      int descriptionCount = RavelCReadWindow::Read8(raw + p);
      char* description = RavelText_NewCText(raw + p + 1, descriptionCount);
      p += 1 + descriptionCount;
      int itemCount = RavelCReadWindow::Read8(raw + p);
      char* item = RavelText_NewCText(raw + p + 1, itemCount);
      p += 1 + itemCount;
      aItems.Append(new RavelCExtendedEvent(description, item));
    } while (raw + p < itemsEnd);
  }

  // The copy starts at the text_length byte itself and takes text_length bytes.
  int textCount = RavelCReadWindow::Read8(raw + p);
  pText = RavelText_NewCText(raw + p, textCount);
  return kRavelOk;
}

void RavelCExtendedEventDescriptor::Show() {
  ShowHeader(kKind, __LINE__);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tDescriptorNumber=[%d]\n", iDescriptorNumber);
  RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tLastDescriptorNumber=[%d]\n", iLastDescriptorNumber);
  for (int i = 0; i < aItems.iCount; ++i) {
    RavelCExtendedEvent* item = aItems.ipArray[i];
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tItemDescription=[%s]\n", RavelTraceText(item->pItemDescription));
    RAVEL_TRACE(RAVEL_PARSER_DUMP, "\tItem=[%s]\n", RavelTraceText(item->pItem));
  }
}

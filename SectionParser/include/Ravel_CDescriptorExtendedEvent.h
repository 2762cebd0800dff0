// Extended event descriptor (tag 0x4E, ARIB STD-B10, ABNT NBR 15603-2):
//   descriptor_number          4   // xxxx....
//   last_descriptor_number     4   // ....xxxx
//   ISO_639_language_code     24
//   length_of_items            8
//   items, each: item_description_length 8, item_description_char,
//                item_length 8, item_char
//   text_length                8
//   text_char                  text_length bytes
//
// The receiver keeps the text starting at its length byte, so the stored text
// is that byte followed by all but the last character of the broadcast text.
#ifndef RAVEL_CDESCRIPTOREXTENDEDEVENT_H
#define RAVEL_CDESCRIPTOREXTENDEDEVENT_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorBase.h"

// One item of the descriptor: a description and its item text, both malloc'd
// and owned.
class RavelCExtendedEvent {
 public:
  // Takes ownership of both texts (malloc'd, either may be null).
  RavelCExtendedEvent(char* description, char* item);
  RavelCExtendedEvent(const RavelCExtendedEvent& other);
  RavelCExtendedEvent& operator=(const RavelCExtendedEvent& other);
  ~RavelCExtendedEvent();

  const char* GetItemDescription() const { return pItemDescription; }
  const char* GetItem() const { return pItem; }

  char* pItemDescription;
  char* pItem;
};

class RavelCExtendedEventDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCExtendedEventDescriptor(unsigned char* raw);
  RavelCExtendedEventDescriptor(RavelCExtendedEventDescriptor& other);
  RavelCExtendedEventDescriptor& operator=(RavelCExtendedEventDescriptor& other);
  virtual ~RavelCExtendedEventDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetDescriptorNumber() const { return iDescriptorNumber; }
  unsigned char GetLastDescriptorNumber() const { return iLastDescriptorNumber; }
  const char* GetLanguageCode() const { return szLanguageCode; }
  int GetNumOfItems() const { return aItems.iCount; }
  // The item at `index`; out of range panics through the array and yields null.
  RavelCExtendedEvent* GetItem(int index) { return aItems[index]; }
  // Null when no descriptor has been parsed.
  const char* GetText() const { return pText; }

  unsigned char iDescriptorNumber = 0;
  unsigned char iLastDescriptorNumber = 0;
  char szLanguageCode[4] = {};
  RavelCArray<RavelCExtendedEvent*> aItems;  // owned records
  char* pText = 0;                               // malloc'd

 private:
  void Release();
};

#endif

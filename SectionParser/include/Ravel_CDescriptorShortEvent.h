// Short event descriptor (tag 0x4D, ARIB STD-B10, ABNT NBR 15603-2):
//   ISO_639_language_code   24
//   event_name_length        8
//   event_name_char          event_name_length bytes
//   text_length              8
//   text_char                text_length bytes
#ifndef RAVEL_CDESCRIPTORSHORTEVENT_H
#define RAVEL_CDESCRIPTORSHORTEVENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCShortEventDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCShortEventDescriptor(unsigned char* raw);
  RavelCShortEventDescriptor(RavelCShortEventDescriptor& other);
  RavelCShortEventDescriptor& operator=(RavelCShortEventDescriptor& other);
  virtual ~RavelCShortEventDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  const char* GetLanguageCode() const { return szLanguageCode; }
  // Both texts are null when no descriptor has been parsed.
  const char* GetEventName() const { return pEventName; }
  const char* GetEventDescription() const { return pEventDescription; }
  // The event description under the name the event readers use.
  const char* GetText() const { return pEventDescription; }

  char szLanguageCode[4] = {};
  char* pEventName = 0;         // malloc'd
  char* pEventDescription = 0;  // malloc'd

 private:
  void Release();
};

#endif

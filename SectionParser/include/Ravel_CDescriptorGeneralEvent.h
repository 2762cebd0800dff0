// General event descriptor (tag 0x40) of a DSM-CC stream descriptor section,
// ARIB STD-B24 Vol. 3 / ABNT NBR 15606-3 event messages:
//   event_msg_group_id 12 | reserved 4 | time_mode 8
//   time field, 40 bits (bytes 5 to 9), by time_mode:
//     1, 5: event_msg_MJD_JST_time (16-bit MJD, 3 BCD bytes)
//     2:    reserved 7 | event_msg_NPT 33
//     3:    reserved 4 | event_msg_relativeTime (BCD digits hh mm ss ...)
//   event_msg_type 8 | event_msg_id 16 | private_data_byte: the rest
// The message fields are read at bytes 10 to 12 whatever the time mode.
#ifndef RAVEL_CDESCRIPTORGENERALEVENT_H
#define RAVEL_CDESCRIPTORGENERALEVENT_H

#include "Ravel_CDateTime.h"
#include "Ravel_CDescriptorBase.h"

// The relative time of time mode 3.
struct RavelCEventRelativeTime {
  int iHours;
  int iMinutes;
  int iSeconds;
};

class RavelCGeneralEventDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCGeneralEventDescriptor(unsigned char* raw);
  RavelCGeneralEventDescriptor(RavelCGeneralEventDescriptor& other);
  RavelCGeneralEventDescriptor& operator=(RavelCGeneralEventDescriptor& other);
  virtual ~RavelCGeneralEventDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned short GetEventMsgGroupId() const { return iEventMsgGroupId; }
  unsigned char GetTimeMode() const { return iTimeMode; }
  const RavelCDateTime& GetEventMsgMJDJSTTime() const { return cEventMsgMJDJSTTime; }
  const unsigned char* GetEventMsgNPT() const { return aEventMsgNPT; }
  const RavelCEventRelativeTime& GetEventMsgRelativeTime() const { return cEventMsgRelativeTime; }
  unsigned char GetEventMsgType() const { return iEventMsgType; }
  unsigned short GetEventMsgId() const { return iEventMsgId; }
  unsigned char GetPrivateDataLength() const { return iPrivateDataLength; }
  // Null until a parse succeeds; iPrivateDataLength bytes and a 0.
  const char* GetPrivateData() const { return pPrivateData; }

  unsigned short iEventMsgGroupId;  // 12 bits
  unsigned char iTimeMode;
  RavelCDateTime cEventMsgMJDJSTTime;             // time modes 1 and 5
  unsigned char aEventMsgNPT[5];                  // time mode 2: bit 32 alone, then bits 31 to 0
  RavelCEventRelativeTime cEventMsgRelativeTime;  // time mode 3
  unsigned char iEventMsgType;
  unsigned short iEventMsgId;
  unsigned char iPrivateDataLength;
  char* pPrivateData;  // malloc'ed
};

#endif

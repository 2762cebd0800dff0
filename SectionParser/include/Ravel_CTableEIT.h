// Event information table (ARIB STD-B10, ABNT NBR 15603-2; table_id 0x4E actual
// present/following, 0x4F other present/following, 0x50 actual schedule, 0x60 to
// 0x6F other schedule), after the long section header (table id extension =
// service_id):
//   transport_stream_id           16
//   original_network_id           16
//   segment_last_section_number    8
//   last_table_id                  8
//   events, each:
//     event_id                    16
//     start_time                  40   (16-bit MJD, then hour, minute, second: BCD)
//     duration                    24   (hours, minutes, seconds: BCD)
//     running_status               3   // xxx.....
//     free_CA_mode                 1   // ...x....
//     descriptors_loop_length     12   // ....xxxx xxxxxxxx
//     descriptors
//   CRC_32                        32
#ifndef RAVEL_CTABLEEIT_H
#define RAVEL_CTABLEEIT_H

#include "Ravel_CArray.h"
#include "Ravel_CDateTime.h"
#include "Ravel_CTableBase.h"
#include "Ravel_List.h"

class RavelCShortEventDescriptor;
class RavelCContentDescriptor;
class RavelCComponentDescriptor;
class RavelCParentalRatingDescriptor;
class RavelCAudioComponentDescriptor;
class RavelCCopyrightDescriptor;
class RavelCExtendedEventDescriptor;
class RavelCSeriesDescriptor;

// One event of the loop with the event descriptors the receiver keeps: the last
// one of each kind, and every audio component.
class RavelCEventInfo {
 public:
  // Null gives a cleared event with an empty audio component list.
  explicit RavelCEventInfo(unsigned char* event);
  RavelCEventInfo(RavelCEventInfo& other);
  // Drops this event's descriptors first, so assigning an event to itself
  // leaves it without descriptors.
  RavelCEventInfo& operator=(RavelCEventInfo& other);
  virtual ~RavelCEventInfo();

  // Null clears the fields and gives -8; a descriptor with tag 0 or length 0
  // clears them too, releases the audio component list and gives -24.
  virtual int ParseRawData(unsigned char* event);
  virtual void Show();

  // By start time.
  int operator<(const RavelCEventInfo& other) const;
  int operator<=(const RavelCEventInfo& other) const;
  int operator>(const RavelCEventInfo& other) const;
  int operator>=(const RavelCEventInfo& other) const;

  // Entries of the audio component list as its 8-bit count tells them; 0 when a
  // failed parse released the list.
  int GetAudioComponentCount() const;
  // The entry at `index`, or null outside the list.
  RavelCAudioComponentDescriptor* GetAudioComponent(int index) const;

  unsigned short iEventId;
  // Year to second by the receiver's MJD and BCD rules; the other three fields 0.
  RavelCDateTime cStartTime;
  int iDurationHour;
  int iDurationMinute;
  int iDurationSecond;
  unsigned char iRunningStatus;                               // 3 bits
  unsigned char bFreeCAMode;                                  // 1 bit
  unsigned short iDescriptorsLoopLength;                      // 12 bits
  unsigned char iSpare = 0;                                       // cleared and copied, never parsed
  RavelCShortEventDescriptor* pShortEventDescriptor = 0;          // 0x4D, owned
  RavelCContentDescriptor* pContentDescriptor = 0;                // 0x54, owned
  RavelCComponentDescriptor* pComponentDescriptor = 0;            // 0x50, owned
  RavelCParentalRatingDescriptor* pParentalRatingDescriptor = 0;  // 0x55, owned
  // Every audio component descriptor (0xC4) in arrival order; the list releases
  // them when emptied. Null only after a parse failed on a malformed descriptor.
  list_head* pAudioComponentList = 0;
  RavelCCopyrightDescriptor* pCopyrightDescriptor = 0;  // 0x0D, owned
  // Only the last of an event's extended event descriptors is kept.
  RavelCExtendedEventDescriptor* pExtendedEventDescriptor = 0;  // 0x4E, owned
  RavelCSeriesDescriptor* pSeriesDescriptor = 0;                // 0xD5, owned

 private:
  void DeleteDescriptors();
  // Empties the audio component list, or allocates it when there is none.
  void ResetAudioComponentList();
  void ReleaseAudioComponentList();
  void ClearFields();
};

class RavelCEIT : public RavelCTableBase {
 public:
  explicit RavelCEIT(unsigned char* section);
  RavelCEIT(RavelCEIT& other);
  // Empties this table's events before copying, so assigning a table to itself
  // leaves it without events. iEITTableId is not copied.
  RavelCEIT& operator=(RavelCEIT& other);
  virtual ~RavelCEIT();

  // Joins another section of the same sub-table: when transport_stream_id,
  // original_network_id and version_number agree, appends copies of its events
  // and sorts all events by start time (ties keep their order); otherwise traces
  // the difference and changes nothing.
  RavelCEIT& operator+=(RavelCEIT& other);

  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  int GetEventCount() const { return aEventInfo.iCount; }
  // The event at `index` (bounds-checked by the array).
  RavelCEventInfo* GetEventInfo(int index) { return aEventInfo[index]; }

  unsigned char iEITTableId = 0;  // table_id of the last accepted section
  unsigned short iTransportStreamId = 0;
  unsigned short iOriginalNetworkId = 0;
  unsigned char iSegmentLastSectionNumber = 0;
  unsigned char iLastTableId = 0;
  RavelCPointerArray<RavelCEventInfo> aEventInfo;  // owned events

 private:
  void ClearFields();
};

#endif

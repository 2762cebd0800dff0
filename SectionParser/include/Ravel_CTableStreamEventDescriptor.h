// DSM-CC stream descriptor section (table_id 0x3D), ISO/IEC 13818-6 9.2.2:
// the 8-byte long section header, then nothing but stream descriptors up to
// the CRC_32 (checked only when section_syntax_indicator is 1):
//   NPT reference descriptors (0x17), of which the last one is kept;
//   general event descriptors (0x40, ARIB STD-B24 / ABNT NBR 15606-3), all kept in order.
#ifndef RAVEL_CTABLESTREAMEVENTDESCRIPTOR_H
#define RAVEL_CTABLESTREAMEVENTDESCRIPTOR_H

#include "Ravel_CArray.h"
#include "Ravel_CDescriptorGeneralEvent.h"
#include "Ravel_CDescriptorNPTReference.h"
#include "Ravel_CTableBase.h"

class RavelCDsmccStreamEvent : public RavelCTableBase {
 public:
  explicit RavelCDsmccStreamEvent(unsigned char* section);
  // Copies keep the header, the name and the NPT reference, but never any general
  // event descriptor: a copy's general event list is always empty. The target's
  // descriptors are released first, so a table assigned to itself keeps neither.
  RavelCDsmccStreamEvent(RavelCDsmccStreamEvent& other);
  RavelCDsmccStreamEvent& operator=(RavelCDsmccStreamEvent& other);
  virtual ~RavelCDsmccStreamEvent();

  // 0; -8 for a null section; -24 for a CRC error or a zero tag or length in the loop.
  virtual int ParseRawData(unsigned char* section);
  virtual void Show();

  // Null when the section held no NPT reference that parsed.
  RavelCNPTReferenceDescriptor* GetNPTReference() const { return pNPTReference; }
  int GetNumberOfGeneralEvents() const { return cGeneralEvents.iCount; }
  // The general event at `index` in section order; out of range, the array's
  // bound panic, then null.
  RavelCGeneralEventDescriptor* GetGeneralEvent(int index) { return cGeneralEvents[index]; }

  RavelCNPTReferenceDescriptor* pNPTReference = 0;
  // A plain array of pointers: the table deletes the descriptors itself.
  RavelCArray<RavelCGeneralEventDescriptor*> cGeneralEvents;

 private:
  void ReleaseDescriptors();
};

#endif

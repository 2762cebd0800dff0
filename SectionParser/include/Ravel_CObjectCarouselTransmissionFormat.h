// Object carousel transmission format of the additional Ginga information
// (transmission_format 2; ABNT NBR 15606-3):
//   carousel_id 32
//   on_demand_retrieval_flag 1 | file_storable_flag 1 | event_section_flag 1 | reserved 5
#ifndef RAVEL_COBJECTCAROUSELTRANSMISSIONFORMAT_H
#define RAVEL_COBJECTCAROUSELTRANSMISSIONFORMAT_H

class RavelCObjectCarouselTransmissionFormat {
 public:
  RavelCObjectCarouselTransmissionFormat();

  // Decodes from the carousel_id byte, tracing each value; null gives -8 and a
  // cleared record.
  int ParseRawData(const unsigned char* raw);

  unsigned char GetOnDemandRetrievalFlag() const { return bOnDemandRetrievalFlag; }
  unsigned char GetFileStorableFlag() const { return bFileStorableFlag; }
  unsigned char GetEventSectionFlag() const { return bEventSectionFlag; }

  unsigned int iCarouselId = 0;
  unsigned char bOnDemandRetrievalFlag = 0;
  unsigned char bFileStorableFlag = 0;
  unsigned char bEventSectionFlag = 0;
};

#endif

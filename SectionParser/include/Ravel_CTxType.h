// One transmission-type record of the TS information descriptor (ARIB STD-B10,
// ts_information_descriptor loop):
//   transmission_type_info 8 | num_of_service 8 | { service_id 16 } num_of_service times
// The next record follows right after the last service_id.
#ifndef RAVEL_CTXTYPE_H
#define RAVEL_CTXTYPE_H

class RavelCTxType {
 public:
  RavelCTxType();
  explicit RavelCTxType(unsigned char* raw);
  RavelCTxType(const RavelCTxType& other);
  RavelCTxType& operator=(const RavelCTxType& other);
  virtual ~RavelCTxType();

  // Null clears the record and gives -8.
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetTransmissionTypeInfo() const { return iTransmissionTypeInfo; }
  unsigned char GetNumOfService() const { return iNumOfService; }
  // An index outside 0..count-1 panics; if the panic handler returns, gives 0.
  unsigned short GetServiceId(int index) const;
  // Bytes the record takes in the descriptor: 2 + 2 x number of services.
  int GetRecordSize() const { return 2 + 2 * iNumOfService; }

  unsigned char iTransmissionTypeInfo = 0;
  unsigned char iNumOfService = 0;
  unsigned short* pServiceIds = 0;  // iNumOfService entries (new[]), null when there are none

 private:
  void Release();
};

#endif

// TS information descriptor (tag 0xCD, ARIB STD-B10 / ABNT NBR 15603-2,
// ts_information_descriptor):
//   remote_control_key_id 8 | length_of_ts_name 6 | transmission_type_count 2
//   ts_name_char ... | transmission type records (see RavelCTxType), back to back
#ifndef RAVEL_CDESCRIPTORTSINFORMATION_H
#define RAVEL_CDESCRIPTORTSINFORMATION_H

#include "Ravel_CDescriptorBase.h"
#include "Ravel_CTxType.h"

class RavelCTSInformationDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;
  // transmission_type_count has two bits: at most three records are filled.
  enum { kTxTypeSlots = 4 };

  explicit RavelCTSInformationDescriptor(unsigned char* raw);
  RavelCTSInformationDescriptor(RavelCTSInformationDescriptor& other);
  RavelCTSInformationDescriptor& operator=(RavelCTSInformationDescriptor& other);
  virtual ~RavelCTSInformationDescriptor();

  // Null zeroes the key id and the count; a foreign tag leaves both, and the
  // records, as they were (only the name is released).
  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetRemoteControlKeyId() const { return iRemoteControlKeyId; }
  const char* GetTsName() const { return sTsName.GetString(); }
  unsigned char GetTransmissionTypeCount() const { return iTransmissionTypeCount; }
  // The record at index 0..3 (only the first GetTransmissionTypeCount() are filled), or null.
  RavelCTxType* GetTxType(int index) { return index >= 0 && index < kTxTypeSlots ? &cTxTypes[index] : 0; }

  unsigned char iRemoteControlKeyId = 0;
  RavelCString sTsName;
  unsigned char iTransmissionTypeCount = 0;
  RavelCTxType cTxTypes[kTxTypeSlots];

 private:
  void ClearTxTypes();
};

#endif

// Audio component descriptor (tag 0xC4, ARIB STD-B10, ABNT NBR 15603-2):
//   reserved_future_use        4   // xxxx....
//   stream_content             4   // ....xxxx
//   component_type             8
//   component_tag              8
//   stream_type                8
//   simulcast_group_tag        8
//   ES_multi_lingual_flag      1   // x.......
//   main_component_flag        1   // .x......
//   quality_indicator          2   // ..xx....
//   sampling_rate              3   // ....xxx.
//   reserved_future_use        1   // .......x
//   ISO_639_language_code     24
//   ISO_639_language_code_2   24   (only when ES_multi_lingual_flag is 1)
//   text_char                  (not read)
//
// Its wrong-tag message and banner are those of the component descriptor.
#ifndef RAVEL_CDESCRIPTORAUDIOCOMPONENT_H
#define RAVEL_CDESCRIPTORAUDIOCOMPONENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCAudioComponentDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCAudioComponentDescriptor(unsigned char* raw);
  RavelCAudioComponentDescriptor(RavelCAudioComponentDescriptor& other);
  RavelCAudioComponentDescriptor& operator=(RavelCAudioComponentDescriptor& other);
  virtual ~RavelCAudioComponentDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned char GetStreamContent() const { return iStreamContent; }
  unsigned char GetComponentType() const { return iComponentType; }
  unsigned char GetComponentTag() const { return iComponentTag; }
  unsigned char GetStreamType() const { return iStreamType; }
  unsigned char GetSimulcastGroupTag() const { return iSimulcastGroupTag; }
  unsigned char GetESMultiLingualFlag() const { return iESMultiLingualFlag; }
  unsigned char GetMainComponentFlag() const { return iMainComponentFlag; }
  unsigned char GetQualityIndicator() const { return iQualityIndicator; }
  unsigned char GetSampleRate() const { return iSampleRate; }
  unsigned int GetISO639LanguageCode() const { return iISO639LanguageCode; }
  const char* GetLanguageCode() const { return szLanguageCode; }
  unsigned int GetISO639LanguageCode2() const { return iISO639LanguageCode2; }
  // "" unless the ES multi-lingual flag is set.
  const char* GetLanguageCode2() const { return szLanguageCode2; }

  unsigned char iStreamContent;       // 4 bits
  unsigned char iComponentType;
  unsigned char iComponentTag;
  unsigned char iStreamType;
  unsigned char iSimulcastGroupTag;
  unsigned char iESMultiLingualFlag;  // 1 bit
  unsigned char iMainComponentFlag;   // 1 bit
  unsigned char iQualityIndicator;    // 2 bits
  unsigned char iSampleRate;          // 3 bits, sampling_rate
  unsigned int iISO639LanguageCode;   // 24 bits, letters big-endian
  char szLanguageCode[4];             // the same three letters and a 0
  unsigned int iISO639LanguageCode2;  // 0 unless the ES multi-lingual flag is set
  char szLanguageCode2[4];

 private:
  void Clear();
};

#endif

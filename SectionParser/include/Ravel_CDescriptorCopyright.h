// Copyright descriptor (tag 0x0D, ISO/IEC 13818-1 2.6.24, ARIB STD-B10):
//   copyright_identifier        32
//   additional_copyright_info   descriptor_length - 4 bytes
//
// The receiver keeps length - 1 bytes of info taken from byte 6, that is three
// bytes beyond the descriptor's end; this length rule is part of its output.
#ifndef RAVEL_CDESCRIPTORCOPYRIGHT_H
#define RAVEL_CDESCRIPTORCOPYRIGHT_H

#include "Ravel_CDescriptorBase.h"

class RavelCCopyrightDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCCopyrightDescriptor(unsigned char* raw);
  RavelCCopyrightDescriptor(RavelCCopyrightDescriptor& other);
  RavelCCopyrightDescriptor& operator=(RavelCCopyrightDescriptor& other);
  virtual ~RavelCCopyrightDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  unsigned int GetCopyrightId() const { return iCopyrightId; }
  // Null when no descriptor has been parsed; always terminated.
  const char* GetCopyrightInfo() const { return pCopyrightInfo; }

  unsigned int iCopyrightId = 0;
  // malloc'd, (length - 1) mod 256 + 1 bytes: the info bytes and a closing 0.
  char* pCopyrightInfo = 0;

 private:
  void Release();
};

#endif

// Ginga application location descriptor (tag 0x07 of the AIT application loop;
// ABNT NBR 15606-3):
//   base_directory_length 8 | base_directory_byte ...
//   class_path_extension_length 8 | class_path_extension_byte ...
//   initial_class_byte ... (the rest of the descriptor)
// Each text goes into a fixed 255-byte field cleared at every parse; a text of
// 255 bytes fills its field without a terminator. The AIT picks this class by
// tag, so the tag is not checked here.
#ifndef RAVEL_CDESCRIPTORGINGAAPPLOC_H
#define RAVEL_CDESCRIPTORGINGAAPPLOC_H

#include "Ravel_CDescriptorBase.h"

class RavelCGingaAppLocDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCGingaAppLocDescriptor(unsigned char* raw);
  RavelCGingaAppLocDescriptor(RavelCGingaAppLocDescriptor& other);
  RavelCGingaAppLocDescriptor& operator=(RavelCGingaAppLocDescriptor& other);
  virtual ~RavelCGingaAppLocDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  // The fields themselves: a field is not terminated when its text fills it.
  const char* GetBaseDirectory() const { return sBaseDirectory; }
  const char* GetClassPath() const { return sClassPath; }
  const char* GetInicialClassName() const { return sInicialClassName; }

  char sBaseDirectory[255];
  char sClassPath[255];
  char sInicialClassName[255];

 private:
  void Clear();
};

#endif

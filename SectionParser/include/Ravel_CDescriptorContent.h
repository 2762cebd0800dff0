// Content descriptor (tag 0x54, ARIB STD-B10, ABNT NBR 15603-2), a loop
// of 2-byte entries:
//   content_nibble_level_1   4   // xxxx....
//   content_nibble_level_2   4   // ....xxxx
//   user_nibble              4
//   user_nibble              4
#ifndef RAVEL_CDESCRIPTORCONTENT_H
#define RAVEL_CDESCRIPTORCONTENT_H

#include "Ravel_CDescriptorBase.h"

class RavelCContentDescriptor : public RavelCDescriptorBase {
 public:
  static const RavelCDescriptorKind kKind;

  explicit RavelCContentDescriptor(unsigned char* raw);
  RavelCContentDescriptor(RavelCContentDescriptor& other);
  RavelCContentDescriptor& operator=(RavelCContentDescriptor& other);
  virtual ~RavelCContentDescriptor();

  virtual int ParseRawData(unsigned char* raw);
  virtual void Show();

  int GetGenreCount() const { return iGenreCount; }
  // For 0 <= index < count: the two nibbles of the genre byte and 1. Otherwise
  // traces "Invalid Array Index!", sets both to 0 and gives 0.
  int GetGenre(int index, unsigned char& level1, unsigned char& level2);
  // The user byte of the entry at `index`; out of range traces as GetGenre and gives 0.
  unsigned char GetUserGenre(int index);

  unsigned char* pGenre = 0;      // new[], iGenreCount entries: level 1 << 4 | level 2
  unsigned char* pUserGenre = 0;  // new[], iGenreCount entries: the two user nibbles
  int iGenreCount = 0;            // descriptor_length >> 1

 private:
  void Release();
  bool CheckIndex(int index);
};

#endif

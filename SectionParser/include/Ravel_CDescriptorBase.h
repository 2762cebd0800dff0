// Common header of every descriptor: descriptor_tag 8 | descriptor_length 8 | body.
//
// Each descriptor class describes itself once with a RavelCDescriptorKind (tag,
// display name, wrong-tag message, Show banner) and lets the base do what every
// class does alike: the header copy, the null and tag checks with their traces,
// the naming, the banner and the base dump line.
#ifndef RAVEL_CDESCRIPTORBASE_H
#define RAVEL_CDESCRIPTORBASE_H

#include "Ravel_CString.h"

struct RavelCDescriptorKind {
  unsigned char iTag;
  const char* szDisplayName;     // stored as the name once the tag matches
  // "This Descriptor isn't ... Descriptor Tag=[0x%x]\n"; null for the classes
  // that accept any tag (the application-loop descriptors, whose class the AIT
  // picks by tag itself).
  const char* szWrongTagFormat;
  const char* szBanner;          // first line of Show
  unsigned int iWrongTagMask;    // trace mask of the wrong-tag message
  bool bTraceNullArgument;       // "Invalid Argument!\n" before refusing a null descriptor
  const char* szSourcePath;      // the class's source, reported with its traces
};

// The mask of almost every wrong-tag message.
#define RAVEL_WRONG_TAG_MASK 0x40000020u

class RavelCDescriptorBase {
 public:
  RavelCDescriptorBase();
  RavelCDescriptorBase(const RavelCDescriptorBase& other);
  RavelCDescriptorBase& operator=(const RavelCDescriptorBase& other);
  virtual ~RavelCDescriptorBase();

  // Copies tag and length and names the descriptor "Unknown Descriptor";
  // null gives -8 with tag and length 0.
  virtual int ParseRawData(unsigned char* raw);
  // "\tDescriptor Tag=[0x%x], Descriptor Length=[%d], Name=[%s]\n"
  virtual void Show();

  unsigned char GetDescriptorTag() const { return iDescriptorTag; }
  unsigned char GetDescriptorLength() const { return iDescriptorLength; }
  const char* GetDescriptorName() const { return sDescriptorName.GetString(); }

  unsigned char iDescriptorTag = 0;
  unsigned char iDescriptorLength = 0;
  RavelCString sDescriptorName;

 protected:
  // The shared first steps of a class's ParseRawData, after it has released its
  // previous parse: base parse, null check, tag check (skipped when the kind has
  // no wrong-tag message), naming. Gives 0 when the class is to decode its body,
  // or the result code it is to return. Its traces name the class's source and
  // `sourceLine`, the line of the call.
  int ParseHeader(unsigned char* raw, const RavelCDescriptorKind& kind, int sourceLine);
  // The banner at `mask`, then the base line, which keeps the dump level.
  void ShowHeader(const RavelCDescriptorKind& kind, int sourceLine, unsigned int mask = 0x10000020u);
};

#endif

// A small owning text: table and descriptor names and decoded broadcast texts.
// The bytes are kept exactly as given, with no character-set conversion.
#ifndef RAVEL_CSTRING_H
#define RAVEL_CSTRING_H

class RavelCString {
 public:
  RavelCString();
  RavelCString(const char* text);  // null gives an empty string
  RavelCString(const RavelCString& other);
  ~RavelCString();

  RavelCString& operator=(const char* text);
  RavelCString& operator=(const RavelCString& other);

  // Adopts a NUL-terminated buffer allocated with new[]; the string releases it with delete[].
  void SetMemAllocedString(char* buffer);

  // Never null: an empty string yields "".
  const char* GetString() const;
  unsigned int GetLength() const;
  bool IsEmpty() const;

 private:
  char* pText = 0;
};

#endif

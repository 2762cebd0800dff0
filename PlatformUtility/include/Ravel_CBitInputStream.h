// Most-significant-bit-first reader over a byte buffer. It never reads outside
// the buffer: reads past the end return 0 bits and set the status byte to 1.
// The parser asks for no more bits than a result holds (8, 16 or 32).
#ifndef RAVEL_CBITINPUTSTREAM_H
#define RAVEL_CBITINPUTSTREAM_H

class RavelCBitInputStream {
 public:
  RavelCBitInputStream(const unsigned char* buffer, unsigned int length, unsigned char flag);
  ~RavelCBitInputStream();

  unsigned char ReadBit(unsigned char& status);
  unsigned char ReadByte(int bitCount, unsigned char& status);
  unsigned short ReadShort(int bitCount, unsigned char& status);
  unsigned int ReadInt(int bitCount, unsigned char& status);
  void Skip(int bitCount);
  // Copies the next whole bytes (starting at the current byte index) and advances.
  void GetByteArray(unsigned char* destination, int byteCount);

  // Index of the next whole byte: the byte that holds the next bit when the
  // reader stands on a byte boundary, the byte after it otherwise.
  unsigned int GetByteIndex() const;

 private:
  unsigned int ReadBits(int bitCount, unsigned char& status);

  const unsigned char* pBuffer;
  unsigned int iLength;
  unsigned int iBitPosition = 0;
};

#endif

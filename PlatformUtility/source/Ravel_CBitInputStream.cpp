#include "Ravel_CBitInputStream.h"

#include <cstring>

RavelCBitInputStream::RavelCBitInputStream(const unsigned char* buffer, unsigned int length, unsigned char)
    : pBuffer(buffer), iLength(buffer ? length : 0u) {}

RavelCBitInputStream::~RavelCBitInputStream() {}

unsigned int RavelCBitInputStream::ReadBits(int bitCount, unsigned char& status) {
  unsigned int value = 0;
  const unsigned long long endBit = static_cast<unsigned long long>(iLength) * 8u;
  for (int i = 0; i < bitCount; ++i) {
    unsigned int bit = 0;
    if (iBitPosition < endBit) {
      bit = (pBuffer[iBitPosition >> 3] >> (7 - (iBitPosition & 7))) & 1u;
    } else {
      status = 1;
    }
    value = (value << 1) | bit;
    ++iBitPosition;
  }
  return value;
}

unsigned char RavelCBitInputStream::ReadBit(unsigned char& status) {
  return static_cast<unsigned char>(ReadBits(1, status));
}

unsigned char RavelCBitInputStream::ReadByte(int bitCount, unsigned char& status) {
  return static_cast<unsigned char>(ReadBits(bitCount, status));
}

unsigned short RavelCBitInputStream::ReadShort(int bitCount, unsigned char& status) {
  return static_cast<unsigned short>(ReadBits(bitCount, status));
}

unsigned int RavelCBitInputStream::ReadInt(int bitCount, unsigned char& status) {
  return ReadBits(bitCount, status);
}

void RavelCBitInputStream::Skip(int bitCount) {
  if (bitCount > 0) iBitPosition += static_cast<unsigned int>(bitCount);
}

void RavelCBitInputStream::GetByteArray(unsigned char* destination, int byteCount) {
  if (destination == 0 || byteCount <= 0) return;
  unsigned int start = GetByteIndex();
  unsigned int count = static_cast<unsigned int>(byteCount);
  unsigned int available = start < iLength ? iLength - start : 0u;
  unsigned int copied = count < available ? count : available;
  if (copied > 0) std::memcpy(destination, pBuffer + start, copied);
  if (copied < count) std::memset(destination + copied, 0, count - copied);
  iBitPosition = (start + count) * 8u;
}

unsigned int RavelCBitInputStream::GetByteIndex() const { return (iBitPosition + 7u) >> 3; }

// Program clock reference of a PCR PID packet (ISO/IEC 13818-1 2.4.3.4/2.4.3.5):
//   adaptation_field_length 8 | flags 8 | program_clock_reference_base 33 | reserved 6 | extension 9
// This receiver takes the flags from the adaptation_field_length byte itself
// (PCR_flag xxx1xxxx, OPCR_flag xxxx1xxx) and the clock from the five bytes
// after the flags byte, as follows:
//   low 32 bits = A[2] << 25 | A[3] << 17 | A[4] << 9 | A[5] | A[6] >> 7 (wrapping)
//   high bits   = A[2] >> 7
// divided by 90 (90 kHz ticks to milliseconds). The extension is ignored.
#ifndef RAVEL_CPCR_H
#define RAVEL_CPCR_H

class RavelCPCR {
 public:
  // mPCR starts at 0; the packet is parsed at once (result dropped).
  explicit RavelCPCR(unsigned char* packet);
  RavelCPCR(const RavelCPCR& other);
  RavelCPCR& operator=(const RavelCPCR& other);
  virtual ~RavelCPCR();

  // 0, -9 (null packet) or -1 (no usable adaptation field). mPCR keeps its
  // value on failure and when neither flag is set.
  virtual int ParseRawData(unsigned char* packet);
  virtual void Show();

  unsigned long long mPCR = 0;  // milliseconds
};

#endif

// Result codes returned by every parse operation of the library.
#ifndef RAVEL_RESULTCODE_H
#define RAVEL_RESULTCODE_H

enum RavelResultCode {
  kRavelOk = 0,
  kRavelErrPcr = -1,               // the PCR reader found no usable adaptation field
  kRavelErrSyncByte = -7,          // a TS packet that does not start with 0x47
  kRavelErrInvalidArgument = -8,   // null buffer, foreign table_id or tag, bad position
  kRavelErrNullSection = -9,       // null buffer to a header parse (table base, TDT, TOT, PCR)
  kRavelErrCorruptSection = -24    // CRC mismatch or malformed loop
};

#endif

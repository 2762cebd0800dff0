// Broadcast dates: the 16-bit Modified Julian Date turned into year, month and
// day by the receiver's fixed rule. That rule is exact except on the first day of
// each month, which it gives as the day after the last of the previous month
// (1 January 2013 is 2012-12-32); callers rely on that result as it is.
#ifndef RAVEL_CDATECODE_H
#define RAVEL_CDATECODE_H

#include "Ravel_CDateTime.h"

void RavelDateCode_DecodeMJD(unsigned int mjd, int& year, int& month, int& day);

// Fills year to second of `dateTime` from a 40-bit UTC field (16-bit MJD, then
// hour, minute and second in BCD) and sets the three remaining fields to 0.
void RavelDateCode_DecodeDateTime(const unsigned char* utc, RavelCDateTime& dateTime);

#endif

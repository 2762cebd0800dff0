#include "Ravel_CDateCode.h"

#include "Ravel_ByteOrder.h"
#include "Ravel_CReadWindow.h"

void RavelDateCode_DecodeMJD(unsigned int mjd, int& year, int& month, int& day) {
  const double date = static_cast<double>(mjd);
  const int y = static_cast<int>((date - 15078.2) / 365.25);
  // The year term enters untruncated and the difference is truncated before the
  // division: this is what moves the first of each month onto the month before.
  const int m = static_cast<int>(static_cast<int>(date - 14956.1 - y * 365.25) / 30.6001);
  day = static_cast<int>((date - 14956.0) - static_cast<int>(y * 365.25) - static_cast<int>(m * 30.6001));
  const int k = (m == 14 || m == 15) ? 1 : 0;
  year = y + k + 1900;
  month = m - 1 - 12 * k;
}

void RavelDateCode_DecodeDateTime(const unsigned char* utc, RavelCDateTime& dateTime) {
  RavelDateCode_DecodeMJD(RavelCReadWindow::Read16(utc), dateTime.iYear, dateTime.iMonth, dateTime.iDay);
  dateTime.iHour = RavelBcd(RavelCReadWindow::Read8(utc + 2));
  dateTime.iMinute = RavelBcd(RavelCReadWindow::Read8(utc + 3));
  dateTime.iSecond = RavelBcd(RavelCReadWindow::Read8(utc + 4));
  dateTime.iMilliSecond = 0;
  dateTime.iDayOfWeek = 0;
  dateTime.iTimeZone = 0;
}

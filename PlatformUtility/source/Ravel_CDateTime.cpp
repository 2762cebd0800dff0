#include "Ravel_CDateTime.h"

RavelCDateTime::RavelCDateTime() {}

int RavelCDateTime::Compare(const RavelCDateTime& other) const {
  const int mine[] = {iYear, iMonth, iDay, iHour, iMinute, iSecond, iMilliSecond};
  const int theirs[] = {other.iYear, other.iMonth, other.iDay, other.iHour, other.iMinute, other.iSecond,
                        other.iMilliSecond};
  for (unsigned int i = 0; i < sizeof(mine) / sizeof(mine[0]); ++i) {
    if (mine[i] != theirs[i]) return mine[i] < theirs[i] ? -1 : 1;
  }
  return 0;
}

int RavelCDateTime::operator<(const RavelCDateTime& other) const { return Compare(other) < 0; }
int RavelCDateTime::operator<=(const RavelCDateTime& other) const { return Compare(other) <= 0; }
int RavelCDateTime::operator>(const RavelCDateTime& other) const { return Compare(other) > 0; }
int RavelCDateTime::operator>=(const RavelCDateTime& other) const { return Compare(other) >= 0; }
int RavelCDateTime::operator==(const RavelCDateTime& other) const { return Compare(other) == 0; }

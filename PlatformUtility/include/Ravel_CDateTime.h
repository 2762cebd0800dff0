// A broadcast date and time as decoded fields. The comparisons order instants
// field by field, most significant first, which is a total order even for the
// out-of-range days that the broadcast date rule produces (day 32 of a month).
#ifndef RAVEL_CDATETIME_H
#define RAVEL_CDATETIME_H

class RavelCDateTime {
 public:
  RavelCDateTime();

  int iYear;
  int iMonth;
  int iDay;
  int iHour;
  int iMinute;
  int iSecond;
  int iMilliSecond;
  int iDayOfWeek;
  int iTimeZone;

  int operator<(const RavelCDateTime& other) const;
  int operator<=(const RavelCDateTime& other) const;
  int operator>(const RavelCDateTime& other) const;
  int operator>=(const RavelCDateTime& other) const;
  int operator==(const RavelCDateTime& other) const;

 private:
  int Compare(const RavelCDateTime& other) const;
};

#endif

// A broadcast date and time as decoded fields. The comparisons order instants
// field by field, most significant first, which is a total order even for the
// out-of-range days that the broadcast date rule produces (day 32 of a month).
#ifndef RAVEL_CDATETIME_H
#define RAVEL_CDATETIME_H

class RavelCDateTime {
 public:
  RavelCDateTime();

  int iYear = 0;
  int iMonth = 0;
  int iDay = 0;
  int iHour = 0;
  int iMinute = 0;
  int iSecond = 0;
  int iMilliSecond = 0;
  int iDayOfWeek = 0;
  int iTimeZone = 0;

  int operator<(const RavelCDateTime& other) const;
  int operator<=(const RavelCDateTime& other) const;
  int operator>(const RavelCDateTime& other) const;
  int operator>=(const RavelCDateTime& other) const;
  int operator==(const RavelCDateTime& other) const;

 private:
  int Compare(const RavelCDateTime& other) const;
};

#endif

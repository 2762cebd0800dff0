// Joining the sections of one table into one object with operator+= (PMT, NIT,
// SDT): both sections must carry the same version_number; then every loop entry
// of the other object is deep-copied, in order, and appended to the target's
// list. The header and name of the target stay as they are, the other object is
// not changed, and duplicates are not looked for.
//
//   RavelCSDT& RavelCSDT::operator+=(RavelCSDT& other) {
//     if (!RAVEL_TABLE_MERGE_CHECK_VERSION(*this, other, "SDT")) return *this;
//     RavelRecordList_AppendCopies(aServiceList, other.aServiceList);
//     return *this;
//   }
#ifndef RAVEL_TABLEMERGE_H
#define RAVEL_TABLEMERGE_H

#include "Ravel_RecordList.h"
#include "Ravel_CTableBase.h"
#include "Ravel_PGL.h"
#include "Ravel_Trace.h"

// Gives true when the two tables may be joined. Otherwise traces
// "Two <shortName> Information have different information! first one=[..],
// second one=[..]\n" at error level with the target's and the other's
// version_number, attributed to the caller's source and line, and gives false.
inline bool RavelTableMerge_CheckVersion(const RavelCTableBase& target, const RavelCTableBase& other,
                                         const char* shortName, const char* sourcePath, int sourceLine) {
  if (target.iVersionNumber == other.iVersionNumber) return true;
  RAVEL_PGL_TRACE_AT(sourcePath, sourceLine, RAVEL_PARSER_ERROR,
                     "Two %s Information have different information! first one=[%d], second one=[%d]\n",
                     RavelTraceText(shortName), target.iVersionNumber, other.iVersionNumber);
  return false;
}

// The version check from a table's source file (after its RAVEL_TRACE_SOURCE),
// so the mismatch trace names that file and line.
#define RAVEL_TABLE_MERGE_CHECK_VERSION(target, other, shortName) \
  RavelTableMerge_CheckVersion((target), (other), (shortName), kRavelTraceSourcePath, __LINE__)

#endif

// Lists of owned record pointers kept in a plain RavelCArray<T*>: the owner
// deletes the records itself before emptying or destroying the array, and a
// copy rebuilds the list record by record with the record's own copy.
#ifndef RAVEL_RECORDLIST_H
#define RAVEL_RECORDLIST_H

#include "Ravel_CArray.h"

template <class T>
inline void RavelRecordList_DeleteAll(RavelCArray<T*>& list) {
  for (int i = 0; i < list.iCount; ++i) {
    delete list.ipArray[i];
    list.ipArray[i] = 0;
  }
  list.iCount = 0;
}

// Appends a deep copy (T's copy constructor) of every record of `source`, in
// order. The count is taken before the first append, so joining a list with
// itself doubles it once instead of chasing its own growing end.
template <class T>
inline void RavelRecordList_AppendCopies(RavelCArray<T*>& target, const RavelCArray<T*>& source) {
  const int count = source.iCount;
  for (int i = 0; i < count; ++i) {
    if (source.ipArray[i] != 0) target.Append(new T(*source.ipArray[i]));
  }
}

#endif

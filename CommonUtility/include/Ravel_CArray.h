// Growable arrays in which every list of the parser is kept.
//
// Capacity starts at 8 and grows linearly by 8. Element access is checked: an
// index out of range is traced and reported to the panic handler. If that
// handler returns, the access yields a zeroed scratch element instead of
// reading outside the storage, so a caller that goes on sees a defined value.
#ifndef RAVEL_CARRAY_H
#define RAVEL_CARRAY_H

#include "Ravel_PGL.h"
#include "Ravel_ResultCode.h"

#define RAVEL_CARRAY_TRACE_PATH "SectionParser/../CommonUtility/include/Ravel_CArray"
#define RAVEL_CARRAY_TRACE(...) RAVEL_PGL_TRACE_AT(RAVEL_CARRAY_TRACE_PATH, __LINE__, 0x40000001u, __VA_ARGS__)

template <class T>
class RavelCArray {
 public:
  RavelCArray() : ipArray(new T[8]), iCount(0), iMaxCount(8), iGrowSize(8) {}
  virtual ~RavelCArray() { delete[] ipArray; }

  // Makes room for one more element.
  void CheckArraySize() {
    if (iCount < iMaxCount) return;
    iMaxCount += iGrowSize;
    T* grown = new T[iMaxCount];
    for (int i = 0; i < iCount; ++i) grown[i] = ipArray[i];
    delete[] ipArray;
    ipArray = grown;
  }

  // Appends through the size check, as every owner does.
  void Append(const T& value) {
    CheckArraySize();
    ipArray[iCount] = value;
    ++iCount;
  }

  int Insert(const T& value, int pos) {
    if (pos < 0 || pos > iCount) {
      RAVEL_CARRAY_TRACE("Argument Invalid! aPos=[%d], iCount=[%d]\n", pos, iCount);
      return kRavelErrInvalidArgument;
    }
    CheckArraySize();
    for (int i = iCount; i > pos; --i) ipArray[i] = ipArray[i - 1];
    ipArray[pos] = value;
    ++iCount;
    return kRavelOk;
  }

  T& operator[](int index) {
    if (index < 0 || index >= iCount) {
      RAVEL_CARRAY_TRACE("Array Bound Overflow! anIndex=[%d], iCount=[%d]\n", index, iCount);
      RavelPGL_CheckAndInitDebug();
      RavelPGL_Panic();
      static T scratch;
      scratch = T();
      return scratch;
    }
    return ipArray[index];
  }

  T* ipArray;
  int iCount;
  int iMaxCount;
  int iGrowSize;

 private:
  RavelCArray(const RavelCArray&);
  RavelCArray& operator=(const RavelCArray&);
};

// Owns the pointed-to elements and deletes them.
template <class T>
class RavelCPointerArray : public RavelCArray<T*> {
 public:
  RavelCPointerArray() {}
  virtual ~RavelCPointerArray() { DeleteElements(); }

  int RemoveAll() {
    DeleteElements();
    this->iCount = 0;
    return kRavelOk;
  }

  // Stable insertion sort by the elements' operator<. The walk always runs down
  // to index 0, so equal elements keep their arrival order.
  void Sort() {
    if (this->iCount < 2) return;
    for (int i = 1; i < this->iCount; ++i) {
      T* taken = this->ipArray[i];
      int hole = i;
      for (int j = i; j >= 1; --j) {
        if (*taken < *this->ipArray[j - 1]) {
          this->ipArray[j] = this->ipArray[j - 1];
          hole = j - 1;
        }
      }
      this->ipArray[hole] = taken;
    }
  }

 private:
  void DeleteElements() {
    for (int i = 0; i < this->iCount; ++i) {
      delete this->ipArray[i];
      this->ipArray[i] = 0;
    }
  }
};

#endif

// Copy checks the table classes share: a copy made by construction and one
// made by assignment over another parse, both outliving their source.
#ifndef RAVEL_TESTS_TABLE_COPY_CHECKS_H
#define RAVEL_TESTS_TABLE_COPY_CHECKS_H

#include <gtest/gtest.h>

#include <memory>

#include "TestHelpers.h"
#include "TraceRecorder.h"

namespace tcc {

// `prepare` sets what no parse writes; the source is gone before `check(copy,
// sourceDump)` runs, the constructed copy first, so whatever a copy still reads
// is its own.
template <class T, class Prepare, class Check>
void ExpectCopies(unsigned char* source, unsigned char* over, Prepare prepare, Check check) {
  std::unique_ptr<T> original(new T(source));
  prepare(*original);
  const TraceLines shown = th::ShowLines(*original);
  T constructed(*original);
  T assigned(over);
  assigned = *original;
  original.reset();
  for (T* copy : {&constructed, &assigned}) {
    SCOPED_TRACE(copy == &constructed ? "constructed" : "assigned");
    check(*copy, shown);
  }
}

}  // namespace tcc

#endif

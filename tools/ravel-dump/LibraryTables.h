// The library's table and message classes behind one small interface, chosen
// by the kind of a section: parse, join the sections of one table with the
// table's own operator+=, and Show().
#ifndef RAVEL_DUMP_LIBRARYTABLES_H
#define RAVEL_DUMP_LIBRARYTABLES_H

#include <memory>

#include "TableKind.h"

namespace ravel_dump {

class TableObject {
 public:
  virtual ~TableObject() {}
  // Parses a whole section (for the DSM-CC messages, the message after the
  // section header). Gives the library's result code.
  virtual int Parse(unsigned char* section) = 0;
  // this += other, for the kinds whose sections are joined; `other` is an
  // object of the same kind.
  virtual void Join(TableObject& other) = 0;
  virtual void Show() = 0;
};

// An empty object of the kind's class; null for a kind the library has no
// class for (CAT and other tables).
std::unique_ptr<TableObject> MakeTableObject(TableKind kind);

}  // namespace ravel_dump

#endif

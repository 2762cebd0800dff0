#include "LibraryTables.h"

#include "RavelSectionParser.h"

namespace ravel_dump {
namespace {

// A section table built over the whole section.
template <class T>
class Table : public TableObject {
 public:
  Table() : object_(nullptr) {}
  int Parse(unsigned char* section) override { return object_.ParseRawData(section); }
  void Join(TableObject&) override {}
  void Show() override { object_.Show(); }

 protected:
  T object_;
};

// A table whose sections are joined with its operator+=.
template <class T>
class JoinedTable : public Table<T> {
 public:
  void Join(TableObject& other) override { this->object_ += static_cast<JoinedTable&>(other).object_; }
};

// The AIT has only a default constructor.
class AitTable : public TableObject {
 public:
  int Parse(unsigned char* section) override { return object_.ParseRawData(section); }
  void Join(TableObject& other) override { object_ += static_cast<AitTable&>(other).object_; }
  void Show() override { object_.Show(); }

 private:
  RavelCAIT object_;
};

}  // namespace

std::unique_ptr<TableObject> MakeTableObject(TableKind kind) {
  switch (kind) {
    case TableKind::kPat:
      return std::unique_ptr<TableObject>(new Table<RavelCPAT>);
    case TableKind::kAit:
      return std::unique_ptr<TableObject>(new AitTable);
    default:
      return nullptr;
  }
}

}  // namespace ravel_dump

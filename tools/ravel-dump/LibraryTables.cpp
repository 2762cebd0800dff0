#include "LibraryTables.h"

#include "Ravel_CDsmccDDB.h"
#include "Ravel_CDsmccDII.h"
#include "Ravel_CDsmccDSI.h"
#include "Ravel_CDsmccMsgBase.h"
#include "Ravel_CTableAIT.h"
#include "Ravel_CTableBIT.h"
#include "Ravel_CTableEIT.h"
#include "Ravel_CTableNIT.h"
#include "Ravel_CTablePAT.h"
#include "Ravel_CTablePMT.h"
#include "Ravel_CTableSDT.h"
#include "Ravel_CTableStreamEventDescriptor.h"
#include "Ravel_CTableTDT.h"
#include "Ravel_CTableTOT.h"

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

// A DSM-CC message, built over the message that follows the section header.
template <class T>
class Message : public TableObject {
 public:
  Message() : object_(nullptr) {}
  int Parse(unsigned char* section) override { return object_.ParseRawData(section ? section + 8 : nullptr); }
  void Join(TableObject&) override {}
  void Show() override { object_.Show(); }

 private:
  T object_;
};

}  // namespace

std::unique_ptr<TableObject> MakeTableObject(TableKind kind) {
  switch (kind) {
    case TableKind::kPat:
      return std::unique_ptr<TableObject>(new Table<RavelCPAT>);
    case TableKind::kPmt:
      return std::unique_ptr<TableObject>(new JoinedTable<RavelCPMT>);
    case TableKind::kNit:
      return std::unique_ptr<TableObject>(new JoinedTable<RavelCNIT>);
    case TableKind::kSdt:
      return std::unique_ptr<TableObject>(new JoinedTable<RavelCSDT>);
    case TableKind::kEitPf:
    case TableKind::kEitSchedule:
      return std::unique_ptr<TableObject>(new JoinedTable<RavelCEIT>);
    case TableKind::kBit:
      return std::unique_ptr<TableObject>(new JoinedTable<RavelCBIT>);
    case TableKind::kTdt:
      return std::unique_ptr<TableObject>(new Table<RavelCTDT>);
    case TableKind::kTot:
      return std::unique_ptr<TableObject>(new Table<RavelCTOT>);
    case TableKind::kAit:
      return std::unique_ptr<TableObject>(new AitTable);
    case TableKind::kDsi:
      return std::unique_ptr<TableObject>(new Message<RavelCDsmccDSI>);
    case TableKind::kDii:
      return std::unique_ptr<TableObject>(new Message<RavelCDsmccDII>);
    case TableKind::kDdb:
      return std::unique_ptr<TableObject>(new Message<RavelCDsmccDDB>);
    case TableKind::kDsmccOther:
      return std::unique_ptr<TableObject>(new Message<RavelCDsmccBase>);
    case TableKind::kStreamDescriptors:
      return std::unique_ptr<TableObject>(new Table<RavelCDsmccStreamEvent>);
    default:
      return nullptr;
  }
}

}  // namespace ravel_dump

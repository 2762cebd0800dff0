// Rebuilds data-carousel modules (ISO/IEC 13818-6 download protocol): the DII
// lists each module with its size and version and gives the block size; DDB
// messages carry the blocks by module id, version and block number. A module
// is complete when every block has arrived with the length the block size and
// the module size call for. A module the DII declares compressed is inflated
// before it is used or written.
#ifndef RAVEL_DUMP_CAROUSEL_H
#define RAVEL_DUMP_CAROUSEL_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "ModuleInflate.h"
#include "Summary.h"

namespace ravel_dump {

struct ModuleListing {
  uint16_t id = 0;
  uint32_t size = 0;
  uint8_t version = 0;
  std::string name;
  ModuleCompression compression;
};

struct ModuleRef {
  int pid = -1;
  uint32_t downloadId = 0;
  uint16_t id = 0;
  uint8_t version = 0;
};

class CarouselCollector;

// Told of what an object carousel is built from, as it arrives.
class CarouselListener {
 public:
  virtual ~CarouselListener() = default;
  // The IOR in the private data of a DSI of `pid`.
  virtual void OnServiceGateway(int pid, const std::vector<uint8_t>& ior) = 0;
  // A module has all its blocks (once per module version).
  virtual void OnModuleComplete(const CarouselCollector& collector, const ModuleRef& module) = 0;
};

class CarouselCollector {
 public:
  // A DII of `pid` for download `downloadId`.
  void AddModuleList(int pid, uint32_t downloadId, uint16_t blockSize, const std::vector<ModuleListing>& modules);
  // One block; a block already held is not stored again.
  void AddBlock(int pid, uint32_t downloadId, uint16_t moduleId, uint8_t version, uint16_t blockNumber,
                const uint8_t* data, std::size_t size);

  // The service gateway a DSI of `pid` names, handed to the listener.
  void AddServiceGateway(int pid, const std::vector<uint8_t>& ior);
  void SetListener(CarouselListener* listener) { listener_ = listener; }

  // A complete module as the application sees it (inflated when it came
  // compressed). False with a one-line reason.
  bool ModuleContent(const ModuleRef& module, std::vector<uint8_t>& bytes, std::string& error) const;

  // Every module the DIIs listed, by PID and download, with its state.
  std::vector<CarouselSummary> Summarize() const;

  // Writes each complete module to `directory` (created when missing), each
  // through a temporary file renamed into place. Fills in the file names of
  // `carousels`. False with a one-line reason.
  bool WriteModules(const std::string& directory, std::vector<CarouselSummary>& carousels,
                    std::string& error) const;

  bool Empty() const { return listings_.empty(); }

 private:
  typedef std::tuple<int, uint32_t> DownloadKey;                      // PID, downloadId
  typedef std::tuple<int, uint32_t, uint16_t, uint8_t> ModuleKey;     // + module id, version

  struct Download {
    uint16_t blockSize = 0;
    std::map<std::pair<uint16_t, uint8_t>, ModuleListing> modules;  // by id, version
  };

  // The module's bytes when complete; false otherwise.
  bool Assemble(const ModuleKey& key, uint32_t size, uint16_t blockSize, std::vector<uint8_t>& bytes) const;
  unsigned int BlocksHeld(const ModuleKey& key, uint32_t size, uint16_t blockSize) const;
  const ModuleListing* Listing(const ModuleKey& key, uint16_t& blockSize) const;
  // Tells the listener when the module has just become complete.
  void NoteIfComplete(const ModuleKey& key);
  // Forgets the blocks of a module in progress.
  void DropInProgress(const ModuleKey& key);
  // Modules in progress past the age or the total size kept are dropped,
  // the longest unfed first: a carousel that never completes holds no more.
  void LimitInProgress();

  std::map<DownloadKey, Download> listings_;
  std::vector<DownloadKey> order_;
  std::map<ModuleKey, std::map<uint16_t, std::vector<uint8_t>>> blocks_;
  std::set<ModuleKey> completed_;
  // Modules in progress: the block count when each last got a block, and the
  // bytes they hold together.
  std::map<ModuleKey, uint64_t> inProgress_;
  std::size_t bytesInProgress_ = 0;
  uint64_t blocksSeen_ = 0;
  CarouselListener* listener_ = nullptr;
};

// "pid076a_dl00000002_module0001_v1.bin"
std::string ModuleFileName(int pid, uint32_t downloadId, int moduleId, int version);

}  // namespace ravel_dump

#endif

// The object carousel (ISO/IEC 13818-6 U-U objects over the download
// protocol, as ETSI TR 101 202 lays them out): each complete module holds BIOP
// messages, one per object (service gateway, directory, file, stream, stream
// event), keyed by an object key. Directories bind names to the IORs of other
// objects; the DSI's IOR names the service gateway, the root of the tree.
//
// Names and keys come from the air: a binding whose name cannot be a file
// name, a second binding of one name, a binding of an ancestor or of an
// object already bound elsewhere, and an object bound nowhere are each
// reported and left out, so the tree is finite and stays under its root.
#ifndef RAVEL_DUMP_OBJECTCAROUSEL_H
#define RAVEL_DUMP_OBJECTCAROUSEL_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Carousel.h"
#include "FileTree.h"
#include "Summary.h"

namespace ravel_dump {

// Where an IOR's BIOP profile places an object.
struct ObjectLocation {
  bool inCarousel = false;  // false: lite options (another service) or no BIOP profile
  uint32_t carouselId = 0;
  uint16_t moduleId = 0;
  std::string key;
};

struct BiopBinding {
  std::string name;  // the first name component, its closing NUL taken off
  std::string kind;  // "dir", "fil", ...
  int components = 0;
  ObjectLocation target;
};

struct BiopObject {
  std::string key;
  std::string kind;                  // "srg", "dir", "fil", "str", "ste"
  std::vector<BiopBinding> bindings; // of "srg" and "dir"
  std::size_t contentOffset = 0;     // of a "fil" in the module's bytes
  std::size_t size = 0;              // a file's content, or the message body of another kind
};

// Reads an IOR; false when it is cut short or malformed.
bool ParseIor(const uint8_t* data, std::size_t size, ObjectLocation& location);

// The BIOP messages of an inflated module, in order. Stops at the first that
// is malformed, with a one-line `error`, keeping those before it.
bool ParseBiopModule(const std::vector<uint8_t>& module, std::vector<BiopObject>& objects, std::string& error);

// A module's objects as last completed.
struct LoadedModule {
  uint8_t version = 0;
  std::vector<uint8_t> bytes;
  std::vector<BiopObject> objects;
};

// One place in the resolved tree.
struct TreeNode {
  std::vector<std::string> components;  // path below the root
  TreeEntrySummary entry;
  const BiopObject* object = nullptr;    // null when its module is not complete
  const LoadedModule* module = nullptr;
};

// The tree of the carousel rooted at `root`, over the modules held; problems
// are added to `problems`.
std::vector<TreeNode> ResolveTree(const ObjectLocation& root, const std::map<uint16_t, LoadedModule>& modules,
                                  std::vector<std::string>& problems);

// The object carousels of a capture, one per PID with a DSI; fed by the
// module collector as modules complete, writing files as they become known
// when given a directory.
class ObjectCarousels : public CarouselListener {
 public:
  // From now on files are written under `directory`. False with a one-line reason.
  bool WriteFilesTo(const std::string& directory, std::string& error);

  void OnServiceGateway(int pid, const std::vector<uint8_t>& ior) override;
  void OnModuleComplete(const CarouselCollector& collector, const ModuleRef& module) override;

  std::vector<ObjectCarouselSummary> Summarize() const;

 private:
  struct Carousel {
    bool hasRoot = false;
    ObjectLocation root;
    std::map<uint16_t, LoadedModule> modules;
    std::vector<std::string> problems;  // of its modules, as they came
    std::vector<std::string> writeProblems;
    std::map<std::string, std::pair<uint16_t, uint8_t>> written;  // path: module, version
    std::string subdirectory;  // of the output: "" for the first carousel
  };

  // Writes what is complete and new or changed since last time.
  void WriteFiles(Carousel& carousel);

  std::map<int, Carousel> carousels_;
  FileTreeWriter writer_;
};

// The application's entry (base directory and initial class) as a path of
// the tree, and whether a file is there.
void ResolveApplications(const std::vector<ObjectCarouselSummary>& carousels, std::vector<ApplicationSummary>& apps);

}  // namespace ravel_dump

#endif

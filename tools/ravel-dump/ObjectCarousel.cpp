#include "ObjectCarousel.h"

#include <algorithm>
#include <cstdio>
#include <set>

#include "ByteText.h"

namespace ravel_dump {
namespace {

const uint32_t kBiopProfile = 0x49534F06;      // TAG_BIOP
const uint32_t kObjectLocation = 0x49534F50;   // TAG_ObjectLocation
// A path longer than this is refused (PATH_MAX of the common systems).
const std::size_t kMaxPath = 4096;

// Reads big-endian fields inside a bounded range; once a read would pass
// its end, every later read gives 0 and Ok() stays false.
class FieldReader {
 public:
  FieldReader(const uint8_t* data, std::size_t size) : data_(data), size_(size) {}
  bool Ok() const { return ok_; }
  std::size_t At() const { return at_; }
  std::size_t Left() const { return ok_ ? size_ - at_ : 0; }
  uint32_t Number(int bytes) {
    if (!Need(static_cast<std::size_t>(bytes))) return 0;
    uint32_t value = 0;
    for (int i = 0; i < bytes; ++i) value = value << 8 | data_[at_++];
    return value;
  }
  std::string Text(std::size_t length) {
    if (!Need(length)) return std::string();
    std::string text(reinterpret_cast<const char*>(data_ + at_), length);
    at_ += length;
    return text;
  }
  const uint8_t* Skip(std::size_t length) {
    if (!Need(length)) return nullptr;
    const uint8_t* start = data_ + at_;
    at_ += length;
    return start;
  }

 private:
  bool Need(std::size_t length) {
    ok_ = ok_ && size_ - at_ >= length;
    return ok_;
  }
  const uint8_t* data_;
  std::size_t size_;
  std::size_t at_ = 0;
  bool ok_ = true;
};

// Names and kinds end with a NUL that is no part of them.
std::string WithoutClosingNul(std::string text) {
  if (!text.empty() && text.back() == '\0') text.pop_back();
  return text;
}

bool ParseBiopProfile(const uint8_t* data, std::size_t size, ObjectLocation& location) {
  FieldReader in(data, size);
  in.Number(1);  // profile_data_byte_order
  unsigned int components = in.Number(1);
  for (unsigned int i = 0; i < components && in.Ok(); ++i) {
    uint32_t tag = in.Number(4);
    std::size_t length = in.Number(1);
    const uint8_t* body = in.Skip(length);
    if (body == nullptr || tag != kObjectLocation) continue;
    FieldReader component(body, length);
    location.carouselId = component.Number(4);
    location.moduleId = static_cast<uint16_t>(component.Number(2));
    component.Number(2);  // version major, minor
    location.key = component.Text(component.Number(1));
    location.inCarousel = component.Ok();
  }
  return in.Ok();
}

// An IOR: type_id, then tagged profiles; the first BIOP profile places the object.
void ReadIor(FieldReader& in, ObjectLocation& location) {
  location = ObjectLocation();
  in.Text(in.Number(4));  // type_id
  uint32_t profiles = in.Number(4);
  for (uint32_t i = 0; i < profiles && in.Ok(); ++i) {
    uint32_t tag = in.Number(4);
    std::size_t length = in.Number(4);
    const uint8_t* body = in.Skip(length);
    if (body != nullptr && tag == kBiopProfile && !location.inCarousel) ParseBiopProfile(body, length, location);
  }
}

// One binding of a directory or service gateway message body.
void ReadBinding(FieldReader& in, BiopBinding& binding) {
  binding.components = static_cast<int>(in.Number(1));
  for (int i = 0; i < binding.components; ++i) {
    std::string id = WithoutClosingNul(in.Text(in.Number(1)));
    std::string kind = WithoutClosingNul(in.Text(in.Number(1)));
    if (i == 0) {
      binding.name = id;
      binding.kind = kind;
    }
  }
  in.Number(1);  // bindingType
  ReadIor(in, binding.target);
  in.Skip(in.Number(2));  // objectInfo
}

typedef std::pair<uint16_t, std::string> ObjectId;  // module, object key

std::string KindName(const std::string& kind) {
  if (kind == "srg") return "service gateway";
  if (kind == "dir") return "directory";
  if (kind == "fil") return "file";
  if (kind == "str") return "stream";
  if (kind == "ste") return "stream event";
  return "object kind \"" + EscapeBytes(kind) + "\"";
}

std::string Describe(const ObjectId& id) {
  std::string text;
  char hex[4];
  for (unsigned char c : id.second) {
    std::snprintf(hex, sizeof hex, "%02x", c);
    text += hex;
  }
  char module[32];
  std::snprintf(module, sizeof module, " in module 0x%04x", id.first);
  return "object key 0x" + text + module;
}

std::string PathText(const std::vector<std::string>& components) {
  std::string path;
  for (const std::string& c : components) path += "/" + c;
  return path.empty() ? std::string("/") : path;
}

// Why a binding of directory `parent` (a node of `nodes`) is left out, or "".
std::string BindingProblem(const BiopBinding& binding, const std::vector<TreeNode>& nodes,
                           const std::vector<ObjectId>& ids, const std::vector<int>& parents, int parent,
                           const std::set<std::string>& namesSeen, const std::map<ObjectId, std::string>& placed) {
  if (binding.components != 1) return std::to_string(binding.components) + " name components";
  std::string problem = FileNameProblem(binding.name);
  if (!problem.empty()) return problem;
  if (namesSeen.count(binding.name)) return "a second binding of the name";
  if (!binding.target.inCarousel) return "it points outside this carousel";
  const ObjectId id(binding.target.moduleId, binding.target.key);
  for (int at = parent; at >= 0; at = parents[at]) {
    if (ids[at] == id) return "it binds its ancestor " + EscapeBytes(nodes[at].entry.path);
  }
  auto found = placed.find(id);
  if (found != placed.end()) return "its object is bound already at " + EscapeBytes(found->second);
  if (nodes[parent].entry.path.size() + 1 + binding.name.size() > kMaxPath) return "the path grows too long";
  return "";
}

}  // namespace

bool ParseIor(const uint8_t* data, std::size_t size, ObjectLocation& location) {
  FieldReader in(data, size);
  ReadIor(in, location);
  return in.Ok();
}

bool ParseBiopModule(const std::vector<uint8_t>& module, std::vector<BiopObject>& objects, std::string& error) {
  FieldReader in(module.data(), module.size());
  while (in.Left() > 0) {
    const std::size_t messageStart = in.At();
    const std::string where = "BIOP message at byte " + std::to_string(messageStart);
    if (in.Text(4) != "BIOP" || in.Number(1) != 1 || in.Number(1) != 0) {
      error = where + ": no BIOP 1.0 magic";
      return false;
    }
    if (in.Number(1) != 0) {
      error = where + ": not big-endian";
      return false;
    }
    in.Number(1);  // message_type
    const std::size_t messageSize = in.Number(4);
    const uint8_t* message = in.Skip(messageSize);
    if (message == nullptr) {
      error = where + ": " + std::to_string(messageSize) + " bytes declared, the module ends before";
      return false;
    }
    FieldReader body(message, messageSize);
    BiopObject object;
    object.key = body.Text(body.Number(1));
    object.kind = WithoutClosingNul(body.Text(body.Number(4)));
    body.Skip(body.Number(2));  // objectInfo
    unsigned int contexts = body.Number(1);
    for (unsigned int i = 0; i < contexts; ++i) {
      body.Number(4);
      body.Skip(body.Number(2));
    }
    const std::size_t bodyLength = body.Number(4);
    const std::size_t bodyStart = body.At();
    if (!body.Ok() || body.Left() < bodyLength) {
      error = where + ": its header or body is cut short";
      return false;
    }
    if (object.kind == "fil") {
      object.size = body.Number(4);
      object.contentOffset = messageStart + 12 + body.At();
      if (body.Skip(object.size) == nullptr || body.At() > bodyStart + bodyLength) {
        error = where + ": file content passes the message body";
        return false;
      }
    } else if (object.kind == "dir" || object.kind == "srg") {
      object.size = bodyLength;
      unsigned int count = body.Number(2);
      for (unsigned int i = 0; i < count && body.Ok(); ++i) {
        BiopBinding binding;
        ReadBinding(body, binding);
        if (body.Ok()) object.bindings.push_back(binding);
      }
      if (!body.Ok() || body.At() > bodyStart + bodyLength) {
        error = where + ": a binding is cut short";
        return false;
      }
    } else {
      object.size = bodyLength;
    }
    objects.push_back(object);
  }
  return true;
}

std::vector<TreeNode> ResolveTree(const ObjectLocation& root, const std::map<uint16_t, LoadedModule>& modules,
                                  std::vector<std::string>& problems) {
  std::map<ObjectId, std::pair<const BiopObject*, const LoadedModule*>> index;
  for (const auto& kv : modules) {
    for (const BiopObject& object : kv.second.objects) index.emplace(ObjectId(kv.first, object.key), std::make_pair(&object, &kv.second));
  }
  std::vector<TreeNode> nodes;
  std::vector<ObjectId> ids;     // of each node
  std::vector<int> parents;      // of each node, -1 for the root
  std::map<ObjectId, std::string> placed;

  auto add = [&](std::vector<std::string> components, const ObjectId& id, const std::string& kind, int parent) {
    TreeNode node;
    node.components = std::move(components);
    node.entry.path = PathText(node.components);
    node.entry.module = id.first;
    node.entry.kind = KindName(kind);
    auto found = index.find(id);
    if (found != index.end()) {
      node.object = found->second.first;
      node.module = found->second.second;
      node.entry.kind = KindName(node.object->kind);
      node.entry.size = node.object->size;
      node.entry.version = node.module->version;
      node.entry.complete = true;
    }
    placed.emplace(id, node.entry.path);
    nodes.push_back(std::move(node));
    ids.push_back(id);
    parents.push_back(parent);
  };

  add({}, ObjectId(root.moduleId, root.key), "srg", -1);
  // Each object is placed once at most, so the walk ends and holds no more
  // nodes than the modules hold bindings.
  for (std::size_t at = 0; at < nodes.size(); ++at) {
    if (nodes[at].object == nullptr) continue;
    std::set<std::string> namesSeen;
    for (const BiopBinding& binding : nodes[at].object->bindings) {
      std::string problem = BindingProblem(binding, nodes, ids, parents, static_cast<int>(at), namesSeen, placed);
      if (!problem.empty()) {
        problems.push_back(EscapeBytes(nodes[at].entry.path) + ": binding \"" + EscapeBytes(binding.name) +
                           "\" left out: " + problem);
        continue;
      }
      namesSeen.insert(binding.name);
      std::vector<std::string> components = nodes[at].components;
      components.push_back(binding.name);
      add(std::move(components), ObjectId(binding.target.moduleId, binding.target.key), binding.kind,
          static_cast<int>(at));
    }
  }
  for (const auto& kv : index) {
    if (!placed.count(kv.first)) problems.push_back(Describe(kv.first) + " (" + KindName(kv.second.first->kind) + ") is bound nowhere");
  }
  std::vector<std::size_t> order(nodes.size());
  for (std::size_t i = 0; i < order.size(); ++i) order[i] = i;
  std::sort(order.begin(), order.end(),
            [&](std::size_t a, std::size_t b) { return nodes[a].components < nodes[b].components; });
  std::vector<TreeNode> sorted;
  for (std::size_t i : order) sorted.push_back(std::move(nodes[i]));
  return sorted;
}

bool ObjectCarousels::WriteFilesTo(const std::string& directory, std::string& error) {
  return writer_.Open(directory, "file", error);
}

void ObjectCarousels::OnServiceGateway(int pid, const std::vector<uint8_t>& ior) {
  ObjectLocation root;
  if (!ParseIor(ior.data(), ior.size(), root) || !root.inCarousel) return;
  Carousel& carousel = carousels_[pid];
  if (carousel.hasRoot && carousel.root.moduleId == root.moduleId && carousel.root.key == root.key) return;
  if (!carousel.hasRoot) {
    // Carousels after the first are written to a folder of their own.
    for (const auto& other : carousels_) {
      if (other.second.hasRoot) {
        char name[16];
        std::snprintf(name, sizeof name, "pid%04x", pid);
        carousel.subdirectory = name;
      }
    }
  }
  carousel.hasRoot = true;
  carousel.root = root;
  WriteFiles(carousel);
}

void ObjectCarousels::OnModuleComplete(const CarouselCollector& collector, const ModuleRef& ref) {
  Carousel& carousel = carousels_[ref.pid];
  char where[64];
  std::snprintf(where, sizeof where, "module 0x%04x version %d: ", ref.id, ref.version);
  std::vector<uint8_t> bytes;
  std::string error;
  if (!collector.ModuleContent(ref, bytes, error)) {
    carousel.problems.push_back(where + error);
    return;
  }
  LoadedModule& module = carousel.modules[ref.id];
  module = LoadedModule();
  module.version = ref.version;
  module.bytes = std::move(bytes);
  if (!ParseBiopModule(module.bytes, module.objects, error)) carousel.problems.push_back(where + error);
  WriteFiles(carousel);
}

void ObjectCarousels::WriteFiles(Carousel& carousel) {
  if (!writer_.IsOpen() || !carousel.hasRoot) return;
  std::vector<std::string> ignored;
  for (const TreeNode& node : ResolveTree(carousel.root, carousel.modules, ignored)) {
    if (!node.entry.complete) continue;
    const bool isFile = node.object->kind == "fil";
    if (!isFile && node.object->kind != "dir" && node.object->kind != "srg") continue;
    const std::pair<uint16_t, uint8_t> made(static_cast<uint16_t>(node.entry.module), node.module->version);
    auto written = carousel.written.find(node.entry.path);
    if (written != carousel.written.end() && written->second == made) continue;
    carousel.written[node.entry.path] = made;
    std::vector<std::string> components = node.components;
    if (!carousel.subdirectory.empty()) components.insert(components.begin(), carousel.subdirectory);
    std::string error;
    bool ok = isFile ? writer_.WriteFile(components, node.module->bytes.data() + node.object->contentOffset,
                                         node.object->size, error)
                     : writer_.MakeDirectory(components, error);
    if (!ok) {
      carousel.writeProblems.push_back(error);
      carousel.written[node.entry.path] = std::make_pair(uint16_t(0xFFFF), uint8_t(0xFF));
    }
  }
}

std::vector<ObjectCarouselSummary> ObjectCarousels::Summarize() const {
  std::vector<ObjectCarouselSummary> summaries;
  for (const auto& kv : carousels_) {
    const Carousel& carousel = kv.second;
    if (!carousel.hasRoot) continue;
    ObjectCarouselSummary summary;
    summary.pid = kv.first;
    summary.problems = carousel.problems;
    for (const TreeNode& node : ResolveTree(carousel.root, carousel.modules, summary.problems)) {
      TreeEntrySummary entry = node.entry;
      auto written = carousel.written.find(entry.path);
      if (writer_.IsOpen() && entry.complete && node.object->kind == "fil" && written != carousel.written.end() &&
          written->second == std::make_pair(static_cast<uint16_t>(entry.module), node.module->version)) {
        entry.file = writer_.Root() + (carousel.subdirectory.empty() ? "" : "/" + carousel.subdirectory) + entry.path;
      }
      summary.entries.push_back(entry);
    }
    summary.problems.insert(summary.problems.end(), carousel.writeProblems.begin(), carousel.writeProblems.end());
    summaries.push_back(summary);
  }
  return summaries;
}

void ResolveApplications(const std::vector<ObjectCarouselSummary>& carousels, std::vector<ApplicationSummary>& apps) {
  if (carousels.empty()) return;
  for (ApplicationSummary& app : apps) {
    // Base directory and initial class as one path from the tree's root.
    std::vector<std::string> components;
    std::string whole = app.path + "/" + app.file;
    std::size_t start = 0;
    while (start <= whole.size()) {
      std::size_t slash = whole.find('/', start);
      if (slash == std::string::npos) slash = whole.size();
      std::string part = whole.substr(start, slash - start);
      if (part == "..") {
        if (!components.empty()) components.pop_back();
      } else if (!part.empty() && part != ".") {
        components.push_back(part);
      }
      start = slash + 1;
    }
    app.entry = PathText(components);
    app.entryChecked = true;
    for (const ObjectCarouselSummary& carousel : carousels) {
      for (const TreeEntrySummary& entry : carousel.entries) {
        app.entryPresent = app.entryPresent || (entry.path == app.entry && entry.kind == "file" && entry.complete);
      }
    }
  }
}

}  // namespace ravel_dump

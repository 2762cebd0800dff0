#include "Carousel.h"

#include <cstdio>

#include "FileTree.h"

namespace ravel_dump {
namespace {

// Modules in progress kept at most: their bytes together, and how many blocks
// of any module may pass without one for them before they are given up.
const std::size_t kInProgressBytes = 4u << 20;
const uint64_t kInProgressAgeBlocks = 100000;

unsigned int BlockCount(uint32_t size, uint16_t blockSize) {
  if (blockSize == 0) return 0;
  return static_cast<unsigned int>((static_cast<uint64_t>(size) + blockSize - 1) / blockSize);
}

std::size_t ExpectedBlockLength(uint32_t size, uint16_t blockSize, unsigned int number) {
  uint64_t offset = static_cast<uint64_t>(number) * blockSize;
  uint64_t rest = size - offset;
  return static_cast<std::size_t>(rest < blockSize ? rest : blockSize);
}

}  // namespace

std::string ModuleFileName(int pid, uint32_t downloadId, int moduleId, int version) {
  char name[96];
  if (pid < 0) {
    std::snprintf(name, sizeof name, "sections_dl%08x_module%04x_v%d.bin", downloadId, moduleId, version);
  } else {
    std::snprintf(name, sizeof name, "pid%04x_dl%08x_module%04x_v%d.bin", pid, downloadId, moduleId, version);
  }
  return name;
}

void CarouselCollector::AddModuleList(int pid, uint32_t downloadId, uint16_t blockSize,
                                      const std::vector<ModuleListing>& modules) {
  DownloadKey key(pid, downloadId);
  auto found = listings_.find(key);
  if (found == listings_.end()) {
    order_.push_back(key);
    found = listings_.emplace(key, Download()).first;
  }
  found->second.blockSize = blockSize;
  // A DII that changes drops the blocks of the module versions it no longer lists.
  std::set<std::pair<uint16_t, uint8_t>> listed;
  for (const ModuleListing& module : modules) listed.insert({module.id, module.version});
  std::vector<ModuleKey> unlisted;
  for (const auto& progress : inProgress_) {
    const ModuleKey& held = progress.first;
    if (std::get<0>(held) == pid && std::get<1>(held) == downloadId &&
        listed.count({std::get<2>(held), std::get<3>(held)}) == 0) {
      unlisted.push_back(held);
    }
  }
  for (const ModuleKey& held : unlisted) DropInProgress(held);
  for (const ModuleListing& module : modules) found->second.modules[{module.id, module.version}] = module;
  for (const ModuleListing& module : modules) NoteIfComplete(ModuleKey(pid, downloadId, module.id, module.version));
}

void CarouselCollector::AddServiceGateway(int pid, const std::vector<uint8_t>& ior) {
  if (listener_ != nullptr) listener_->OnServiceGateway(pid, ior);
}

const ModuleListing* CarouselCollector::Listing(const ModuleKey& key, uint16_t& blockSize) const {
  auto download = listings_.find(DownloadKey(std::get<0>(key), std::get<1>(key)));
  if (download == listings_.end()) return nullptr;
  auto module = download->second.modules.find({std::get<2>(key), std::get<3>(key)});
  if (module == download->second.modules.end()) return nullptr;
  blockSize = download->second.blockSize;
  return &module->second;
}

void CarouselCollector::NoteIfComplete(const ModuleKey& key) {
  if (listener_ == nullptr || completed_.count(key)) return;
  uint16_t blockSize = 0;
  const ModuleListing* listing = Listing(key, blockSize);
  if (listing == nullptr) return;
  auto blocks = blocks_.find(key);
  // Counting the held blocks costs a walk over them: only once there can be enough.
  const std::size_t held = blocks == blocks_.end() ? 0 : blocks->second.size();
  const unsigned int total = BlockCount(listing->size, blockSize);
  if ((blockSize == 0 && listing->size != 0) || held < total || BlocksHeld(key, listing->size, blockSize) != total) return;
  completed_.insert(key);
  // Complete: its blocks are the module now, kept for the outputs.
  auto progress = inProgress_.find(key);
  if (progress != inProgress_.end()) {
    for (const auto& block : blocks->second) bytesInProgress_ -= block.second.size();
    inProgress_.erase(progress);
  }
  ModuleRef module;
  module.pid = std::get<0>(key);
  module.downloadId = std::get<1>(key);
  module.id = std::get<2>(key);
  module.version = std::get<3>(key);
  listener_->OnModuleComplete(*this, module);
}

bool CarouselCollector::ModuleContent(const ModuleRef& module, std::vector<uint8_t>& bytes, std::string& error) const {
  const ModuleKey key(module.pid, module.downloadId, module.id, module.version);
  uint16_t blockSize = 0;
  const ModuleListing* listing = Listing(key, blockSize);
  if (listing == nullptr || !Assemble(key, listing->size, blockSize, bytes)) {
    error = "not complete";
    return false;
  }
  if (!listing->compression.compressed) return true;
  std::vector<uint8_t> inflated;
  if (!InflateModule(bytes, listing->compression.originalSize, inflated, error)) return false;
  bytes.swap(inflated);
  return true;
}

void CarouselCollector::AddBlock(int pid, uint32_t downloadId, uint16_t moduleId, uint8_t version,
                                 uint16_t blockNumber, const uint8_t* data, std::size_t size) {
  const ModuleKey key(pid, downloadId, moduleId, version);
  auto& blocks = blocks_[key];
  if (blocks.find(blockNumber) != blocks.end()) return;
  blocks[blockNumber].assign(data, data + size);
  if (completed_.count(key) == 0) {
    inProgress_[key] = ++blocksSeen_;
    bytesInProgress_ += size;
  }
  NoteIfComplete(key);
  LimitInProgress();
}

void CarouselCollector::DropInProgress(const ModuleKey& key) {
  auto blocks = blocks_.find(key);
  if (blocks != blocks_.end()) {
    for (const auto& block : blocks->second) bytesInProgress_ -= block.second.size();
    blocks_.erase(blocks);
  }
  inProgress_.erase(key);
}

void CarouselCollector::LimitInProgress() {
  while (!inProgress_.empty()) {
    auto oldest = inProgress_.begin();
    for (auto it = inProgress_.begin(); it != inProgress_.end(); ++it) {
      if (it->second < oldest->second) oldest = it;
    }
    const bool tooOld = blocksSeen_ - oldest->second > kInProgressAgeBlocks;
    if (!tooOld && bytesInProgress_ <= kInProgressBytes) return;
    DropInProgress(oldest->first);
  }
}

unsigned int CarouselCollector::BlocksHeld(const ModuleKey& key, uint32_t size, uint16_t blockSize) const {
  auto found = blocks_.find(key);
  if (found == blocks_.end()) return 0;
  unsigned int total = BlockCount(size, blockSize);
  unsigned int held = 0;
  for (const auto& block : found->second) {
    if (block.first < total && block.second.size() == ExpectedBlockLength(size, blockSize, block.first)) ++held;
  }
  return held;
}

bool CarouselCollector::Assemble(const ModuleKey& key, uint32_t size, uint16_t blockSize,
                                 std::vector<uint8_t>& bytes) const {
  unsigned int total = BlockCount(size, blockSize);
  if (size > 0 && total == 0) return false;  // blocks cannot be placed without a block size
  if (BlocksHeld(key, size, blockSize) != total) return false;
  bytes.clear();
  bytes.reserve(size);
  if (total == 0) return true;
  const auto& blocks = blocks_.find(key)->second;
  for (unsigned int n = 0; n < total; ++n) {
    const std::vector<uint8_t>& block = blocks.find(static_cast<uint16_t>(n))->second;
    bytes.insert(bytes.end(), block.begin(), block.end());
  }
  return bytes.size() == size;
}

std::vector<CarouselSummary> CarouselCollector::Summarize() const {
  std::vector<CarouselSummary> carousels;
  for (const DownloadKey& key : order_) {
    const Download& download = listings_.find(key)->second;
    CarouselSummary carousel;
    carousel.pid = std::get<0>(key);
    carousel.downloadId = std::get<1>(key);
    carousel.blockSize = download.blockSize;
    for (const auto& kv : download.modules) {
      const ModuleListing& listing = kv.second;
      ModuleSummary module;
      module.id = listing.id;
      module.size = listing.size;
      module.version = listing.version;
      module.name = listing.name;
      module.compressed = listing.compression.compressed;
      module.originalSize = listing.compression.originalSize;
      ModuleKey moduleKey(carousel.pid, carousel.downloadId, listing.id, listing.version);
      module.blocksTotal = BlockCount(listing.size, download.blockSize);
      module.blocksReceived = BlocksHeld(moduleKey, listing.size, download.blockSize);
      module.complete = (download.blockSize != 0 || listing.size == 0) && module.blocksReceived == module.blocksTotal;
      carousel.modules.push_back(module);
    }
    carousels.push_back(carousel);
  }
  return carousels;
}

bool CarouselCollector::WriteModules(const std::string& directory, std::vector<CarouselSummary>& carousels,
                                     std::string& error) const {
  FileTreeWriter writer;
  if (!writer.Open(directory, "module", error)) return false;
  for (CarouselSummary& carousel : carousels) {
    for (ModuleSummary& module : carousel.modules) {
      if (!module.complete) continue;
      std::vector<uint8_t> bytes;
      ModuleRef ref;
      ref.pid = carousel.pid;
      ref.downloadId = carousel.downloadId;
      ref.id = static_cast<uint16_t>(module.id);
      ref.version = static_cast<uint8_t>(module.version);
      // A module that does not inflate as declared is reported, not written.
      if (!ModuleContent(ref, bytes, module.problem)) continue;
      std::string name = ModuleFileName(carousel.pid, carousel.downloadId, module.id, module.version);
      if (!writer.WriteFile({name}, bytes.data(), bytes.size(), error)) {
        error = directory + error;
        return false;
      }
      module.file = directory + "/" + name;
    }
  }
  return true;
}

}  // namespace ravel_dump

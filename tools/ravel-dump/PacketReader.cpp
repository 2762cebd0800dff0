#include "PacketReader.h"

#include <algorithm>
#include <cstring>

namespace ravel_dump {
namespace {

// One read's worth: big enough that the read calls cost little, small enough
// that the packets read are still in the cache when the demultiplexer takes them.
const std::size_t kChunk = 1u << 20;
// How far into the input the first run of sync bytes is looked for.
const std::size_t kDetectWindow = 1u << 20;
// Enough for a run of sync bytes in every packet size, at any position.
const std::size_t kFirstLook = 4096;
const std::size_t kPacket = 188;
const uint8_t kSync = 0x47;
// Consecutive sync bytes that make a lock; a shorter input must be packets
// from its first byte on, and all of them must agree.
const int kLockRun = 5;
// Sync bytes that confirm a new position after garbage.
const int kResyncRun = 3;
// Damage lines kept for the report; a long noisy input would otherwise grow them.
const std::size_t kDamageLines = 20;

struct Format {
  int stride;
  std::size_t syncOffset;
};
const Format kFormats[] = {{188, 0}, {204, 0}, {192, 4}};

}  // namespace

PacketReader::PacketReader(InputFile& input)
    : input_(input), in_(kChunk), eof_(false), stride_(188),
      syncOffset_(0), packets_(0), skipped_(0), resyncs_(0) {}

void PacketReader::Cut(std::size_t left) {
  skipped_ += left;
  in_.pos = in_.end;
  NoteDamage(input_.Name() + ": truncated: the input ends with " + std::to_string(left) +
         " bytes that do not make a whole packet");
}

void PacketReader::NoteDamage(const std::string& line) {
  if (damage_.size() < kDamageLines) damage_.push_back(line);
}

bool PacketReader::Fill(std::size_t need) {
  while (in_.end - in_.pos < need) {
    if (eof_) return false;
    const long long n = in_.Refill(input_, error_);
    if (n <= 0) eof_ = true;
    if (n < 0) return false;
  }
  return true;
}

bool PacketReader::FindLock(const uint8_t* data, std::size_t size, std::size_t& syncAt, int& stride) {
  const uint8_t* p = data;
  const uint8_t* last = data + size;
  while (p < last) {
    p = static_cast<const uint8_t*>(std::memchr(p, kSync, static_cast<std::size_t>(last - p)));
    if (p == nullptr) return false;
    std::size_t at = static_cast<std::size_t>(p - data);
    for (const Format& f : kFormats) {
      if (at < f.syncOffset) continue;
      std::size_t whole = 0;  // packets whose 188 bytes are all present
      while (whole < kLockRun && at + whole * f.stride + kPacket <= size) ++whole;
      if (whole == 0) continue;
      if (whole < kLockRun && at != f.syncOffset) continue;
      bool run = true;
      for (std::size_t k = 1; k < whole && run; ++k) run = data[at + k * f.stride] == kSync;
      if (run) {
        syncAt = at;
        stride = f.stride;
        return true;
      }
    }
    ++p;
  }
  return false;
}

bool PacketReader::Start(std::string& error) {
  // A live input is locked as soon as its first packets are in; only when
  // they show no lock is more of it waited for, up to the whole window.
  std::size_t syncAt = 0;
  int stride = 0;
  bool locked = false;
  for (std::size_t want = kFirstLook; !locked; want *= 2) {
    const bool more = Fill(std::min(want, kDetectWindow));
    locked = in_.end >= kFirstLook && FindLock(in_.bytes.data(), in_.end, syncAt, stride);
    if (!more || want >= kDetectWindow) break;
  }
  if (!error_.empty()) {
    error = error_;
    return false;
  }
  if (in_.end == 0) {
    error = input_.Name() + ": empty input";
    return false;
  }
  if (!locked && !FindLock(in_.bytes.data(), in_.end, syncAt, stride)) {
    error = input_.Name() +
            ": not a transport stream (no run of 0x47 sync bytes 188, 192 or 204 bytes apart) nor a file of raw "
            "sections (no chain of sections whose CRCs verify); --sections reads it as sections regardless";
    return false;
  }
  stride_ = stride;
  syncOffset_ = SyncOffset(stride);
  in_.pos = syncAt - syncOffset_;
  skipped_ = in_.pos;
  return true;
}

bool PacketReader::RunAt(int stride, std::size_t syncOffset, bool whole) const {
  const std::size_t left = in_.end - in_.pos;
  if (left < syncOffset + kPacket || in_.bytes[in_.pos + syncOffset] != kSync) return false;
  for (int k = 1; k < kResyncRun; ++k) {
    std::size_t at = syncOffset + k * static_cast<std::size_t>(stride);
    if (at >= left) return !whole;  // the input ends: the packets it holds decide
    if (in_.bytes[in_.pos + at] != kSync) return false;
  }
  return true;
}

bool PacketReader::Resync() {
  ++resyncs_;
  // Room for a run at the largest packet size, whichever size the input goes on with.
  const std::size_t look = 4 + (kResyncRun - 1) * 204 + kPacket;
  for (;;) {
    ++in_.pos;
    ++skipped_;
    Fill(look);
    if (!error_.empty()) return false;
    const std::size_t left = in_.end - in_.pos;
    if (left < syncOffset_ + kPacket) {
      Cut(left);
      return false;
    }
    if (RunAt(stride_, syncOffset_, false)) return true;
    // Recorders and remultiplexers change packet size between pieces of a
    // capture; a new size needs a whole run, as the first one did.
    for (const Format& f : kFormats) {
      if (f.stride == stride_ || !RunAt(f.stride, f.syncOffset, true)) continue;
      NoteDamage(input_.Name() + ": the packet size changes from " + std::to_string(stride_) + " to " +
             std::to_string(f.stride) + " bytes at byte " + std::to_string(Offset()));
      stride_ = f.stride;
      syncOffset_ = f.syncOffset;
      return true;
    }
  }
}

const uint8_t* PacketReader::Next() {
  for (;;) {
    // Most packets are whole in the buffer already: no call to fill it.
    if (in_.end - in_.pos < static_cast<std::size_t>(stride_) && !Fill(stride_)) {
      if (!error_.empty()) return nullptr;
      std::size_t left = in_.end - in_.pos;
      if (left >= syncOffset_ + kPacket && in_.bytes[in_.pos + syncOffset_] == kSync) {
        // A last 204-byte packet cut in its 16-byte trailer still has its 188 bytes.
        const uint8_t* packet = in_.bytes.data() + in_.pos + syncOffset_;
        in_.pos = in_.end;
        ++packets_;
        return packet;
      }
      NoteTruncation();
      return nullptr;
    }
    if (in_.bytes[in_.pos + syncOffset_] == kSync) {
      const uint8_t* packet = in_.bytes.data() + in_.pos + syncOffset_;
      in_.pos += stride_;
      ++packets_;
      return packet;
    }
    if (!Resync()) return nullptr;
  }
}

void PacketReader::NoteTruncation() {
  std::size_t left = in_.end - in_.pos;
  if (left == 0) return;
  // Damage, not a failure: the whole packets before it have been read.
  skipped_ += left;
  in_.pos = in_.end;
  NoteDamage(input_.Name() + ": truncated: the input ends inside a packet (" + std::to_string(left) + " of " +
             std::to_string(stride_) + " bytes)");
}

}  // namespace ravel_dump

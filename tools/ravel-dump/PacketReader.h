// Transport stream packets from a capture: 188-byte packets, 192-byte ones
// (a 4-byte time stamp before each packet, as recorders write) or 204-byte
// ones (a 16-byte trailer, as ISDB-Tb captures often carry). The size is told
// by a run of sync bytes 0x47 at the packet spacing; after garbage the reader
// looks for such a run again.
#ifndef RAVEL_DUMP_PACKETREADER_H
#define RAVEL_DUMP_PACKETREADER_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Input.h"
#include "InputBuffer.h"

namespace ravel_dump {

class PacketReader {
 public:
  explicit PacketReader(InputFile& input);

  // Reads the beginning of the input and finds the packet size. False with a
  // one-line reason for an empty input or one that is not a transport stream.
  bool Start(std::string& error);

  // The next 188-byte packet (from its sync byte), valid until the next call;
  // null at the end of the input or on a read error (then Error() is set).
  // Damage met on the way (an input that ends inside a packet, garbage, a
  // change of packet size) is skipped and told by Damage().
  const uint8_t* Next();

  const std::string& Error() const { return error_; }
  // One line per damage met, in input order.
  const std::vector<std::string>& Damage() const { return damage_; }
  int PacketSize() const { return stride_; }
  uint64_t Packets() const { return packets_; }
  uint64_t SkippedBytes() const { return skipped_; }
  uint64_t Resyncs() const { return resyncs_; }
  // Bytes of the input consumed so far.
  uint64_t Offset() const { return in_.base + in_.pos; }

  // Whether `data` holds a run of sync bytes for one of the packet sizes,
  // starting at `offset`; gives the size and the sync position's offset in it.
  static bool FindLock(const uint8_t* data, std::size_t size, std::size_t& syncAt, int& stride);

  // Where the sync byte lies in a packet of `stride` bytes: after the 4-byte
  // time stamp of 192-byte packets, first otherwise.
  static std::size_t SyncOffset(int stride) { return stride == 192 ? 4 : 0; }

 private:
  // Makes `need` bytes from the read position available; false when the input ends first.
  bool Fill(std::size_t need);
  bool Resync();
  // Whether a run of sync bytes `stride` apart starts at the read position + `syncOffset`;
  // unless `whole`, a run cut by the end of the input counts as far as it goes.
  bool RunAt(int stride, std::size_t syncOffset, bool whole) const;
  // The input ends with `left` bytes that make no whole packet.
  void Cut(std::size_t left);
  // The input has ended inside a packet.
  void NoteTruncation();
  void NoteDamage(const std::string& line);

  InputFile& input_;
  InputBuffer in_;
  bool eof_;
  int stride_;
  std::size_t syncOffset_;
  uint64_t packets_;
  uint64_t skipped_;
  uint64_t resyncs_;
  std::string error_;
  std::vector<std::string> damage_;
};

}  // namespace ravel_dump

#endif

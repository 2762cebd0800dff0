// A transport stream received over UDP, unicast or multicast, named the way
// ffmpeg and VLC users name it:
//   udp://239.1.1.1:1234      the multicast group 239.1.1.1, port 1234 (joined)
//   udp://@239.1.1.1:1234     the same, VLC's spelling
//   udp://@:1234              port 1234 on every local address
//   udp://127.0.0.1:5000      port 5000 on that local address (on every local
//                             address when it is not one of this machine's: the
//                             sender's, as ffmpeg reads it)
//   ...?localaddr=10.0.0.2    the interface a group is joined on (ffmpeg's option)
// Each datagram carries whole packets, bare or behind an RTP header (RFC 3550,
// payload type 33, MP2T: RFC 2250), which is detected per datagram and skipped.
#ifndef RAVEL_DUMP_UDPINPUT_H
#define RAVEL_DUMP_UDPINPUT_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ravel_dump {

struct UdpEndpoint {
  std::string address;       // the group or local address; empty for every local address
  uint16_t port = 0;
  std::string localAddress;  // interface of a multicast join; empty for the system's choice
  bool multicast = false;
};

bool IsUdpUrl(const std::string& text);
// False with a one-line reason for a malformed URL.
bool ParseUdpUrl(const std::string& url, UdpEndpoint& endpoint, std::string& error);

// Where the TS bytes of a datagram lie: from 0 for bare packets, past the RTP
// header (its CSRCs and extension) and before its padding for RTP with MP2T.
// False for a datagram that is neither.
bool TsBytesOfDatagram(const uint8_t* datagram, std::size_t size, std::size_t& offset, std::size_t& count);

class UdpReceiver {
 public:
  UdpReceiver();
  ~UdpReceiver();
  UdpReceiver(const UdpReceiver&) = delete;
  UdpReceiver& operator=(const UdpReceiver&) = delete;

  // Binds the port and joins the group. False with a one-line reason.
  bool Open(const std::string& url, std::string& error);
  // Waits for datagrams and gives the TS bytes of at least one (at most `size`;
  // the rest of a large one comes with the next call). 0 once a stop is
  // requested; -1 with `error` on a socket failure.
  long long Read(uint8_t* buffer, std::size_t size, std::string& error);

  uint64_t Datagrams() const { return datagrams_; }
  // Datagrams that held neither packets nor RTP carrying them.
  uint64_t IgnoredDatagrams() const { return ignoredDatagrams_; }

 private:
  int fd_;
  std::vector<uint8_t> datagram_;
  std::size_t pendingAt_;     // TS bytes of the last datagram not handed out yet
  std::size_t pendingCount_;
  uint64_t datagrams_;
  uint64_t ignoredDatagrams_;
};

}  // namespace ravel_dump

#endif

#include "UdpInput.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "StopSignal.h"

namespace ravel_dump {
namespace {

const char kScheme[] = "udp://";
const std::size_t kPacket = 188;
const uint8_t kSync = 0x47;
const std::size_t kMaxDatagram = 65536;
// Room for bursts while the tables are being parsed.
const int kReceiveBuffer = 8 << 20;
// RTP (RFC 3550 5.1): V=2 P X CC | M PT | sequence 16 | timestamp 32 | SSRC 32 | CSRC 32 x CC
const std::size_t kRtpHeader = 12;
const uint8_t kRtpPayloadTypeMp2t = 33;

std::string Failure(const std::string& url, const std::string& what) {
  return url + ": " + what + ": " + std::strerror(errno);
}

bool ParseAddress(const std::string& text, in_addr& address) { return inet_pton(AF_INET, text.c_str(), &address) == 1; }

}  // namespace

bool IsUdpUrl(const std::string& text) { return text.compare(0, sizeof kScheme - 1, kScheme) == 0; }

bool ParseUdpUrl(const std::string& url, UdpEndpoint& endpoint, std::string& error) {
  endpoint = UdpEndpoint();
  std::string rest = url.substr(sizeof kScheme - 1);
  std::string query;
  const std::size_t question = rest.find('?');
  if (question != std::string::npos) {
    query = rest.substr(question + 1);
    rest.erase(question);
  }
  if (!rest.empty() && rest[0] == '@') rest.erase(0, 1);
  const std::size_t colon = rest.rfind(':');
  if (colon == std::string::npos) {
    error = url + ": no port (write udp://GROUP:PORT or udp://@:PORT)";
    return false;
  }
  const std::string port = rest.substr(colon + 1);
  char* end = nullptr;
  const long number = std::strtol(port.c_str(), &end, 10);
  if (port.empty() || *end != '\0' || number < 1 || number > 65535) {
    error = url + ": bad port '" + port + "'";
    return false;
  }
  endpoint.port = static_cast<uint16_t>(number);
  endpoint.address = rest.substr(0, colon);
  in_addr address;
  if (!endpoint.address.empty()) {
    if (!ParseAddress(endpoint.address, address)) {
      error = url + ": '" + endpoint.address + "' is not an IPv4 address";
      return false;
    }
    endpoint.multicast = IN_MULTICAST(ntohl(address.s_addr));
  }
  for (std::size_t at = 0; at < query.size();) {
    std::size_t next = query.find('&', at);
    if (next == std::string::npos) next = query.size();
    const std::string option = query.substr(at, next - at);
    const std::string localAddr = "localaddr=";
    if (option.compare(0, localAddr.size(), localAddr) == 0) {
      endpoint.localAddress = option.substr(localAddr.size());
      if (!ParseAddress(endpoint.localAddress, address)) {
        error = url + ": localaddr '" + endpoint.localAddress + "' is not an IPv4 address";
        return false;
      }
    }
    // Other ffmpeg options (buffer sizes, timeouts) do not change what is read.
    at = next + 1;
  }
  return true;
}

bool TsBytesOfDatagram(const uint8_t* datagram, std::size_t size, std::size_t& offset, std::size_t& count) {
  if (size >= kPacket && datagram[0] == kSync) {
    offset = 0;
    count = size;
    return true;
  }
  if (size < kRtpHeader || (datagram[0] & 0xC0) != 0x80 || (datagram[1] & 0x7F) != kRtpPayloadTypeMp2t) return false;
  std::size_t header = kRtpHeader + 4u * (datagram[0] & 0x0F);
  if ((datagram[0] & 0x10) != 0) {  // extension: profile 16 | length 16 (in 32-bit words) | words
    if (size < header + 4) return false;
    header += 4 + 4u * ((datagram[header + 2] << 8) | datagram[header + 3]);
  }
  std::size_t padding = (datagram[0] & 0x20) != 0 ? datagram[size - 1] : 0;
  if (size < header + padding + kPacket || datagram[header] != kSync) return false;
  offset = header;
  count = size - header - padding;
  return true;
}

UdpReceiver::UdpReceiver()
    : fd_(-1), datagram_(kMaxDatagram), pendingAt_(0), pendingCount_(0), datagrams_(0), ignoredDatagrams_(0) {}

UdpReceiver::~UdpReceiver() {
  if (fd_ >= 0) close(fd_);
}

bool UdpReceiver::Open(const std::string& url, std::string& error) {
  UdpEndpoint endpoint;
  if (!ParseUdpUrl(url, endpoint, error)) return false;
  fd_ = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
  if (fd_ < 0) {
    error = Failure(url, "socket");
    return false;
  }
  // Several programs may follow the same group on one machine.
  const int yes = 1;
  setsockopt(fd_, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes);
  setsockopt(fd_, SOL_SOCKET, SO_RCVBUF, &kReceiveBuffer, sizeof kReceiveBuffer);
  sockaddr_in local;
  std::memset(&local, 0, sizeof local);
  local.sin_family = AF_INET;
  local.sin_port = htons(endpoint.port);
  local.sin_addr.s_addr = htonl(INADDR_ANY);
  // Bound to the group itself, the socket receives only that group's datagrams.
  if (!endpoint.address.empty()) ParseAddress(endpoint.address, local.sin_addr);
  int bound = bind(fd_, reinterpret_cast<const sockaddr*>(&local), sizeof local);
  if (bound != 0 && errno == EADDRNOTAVAIL && !endpoint.multicast) {
    // Not an address of this machine: the sender's, as ffmpeg users may write
    // it; ffmpeg then listens on the port of every local address, and so do we.
    local.sin_addr.s_addr = htonl(INADDR_ANY);
    bound = bind(fd_, reinterpret_cast<const sockaddr*>(&local), sizeof local);
  }
  if (bound != 0) {
    error = Failure(url, "bind");
    return false;
  }
  if (endpoint.multicast) {
    ip_mreq join;
    std::memset(&join, 0, sizeof join);
    join.imr_multiaddr = local.sin_addr;
    join.imr_interface.s_addr = htonl(INADDR_ANY);
    if (!endpoint.localAddress.empty()) ParseAddress(endpoint.localAddress, join.imr_interface);
    if (setsockopt(fd_, IPPROTO_IP, IP_ADD_MEMBERSHIP, &join, sizeof join) != 0) {
      error = Failure(url, "joining the group");
      return false;
    }
  }
  return true;
}

long long UdpReceiver::Read(uint8_t* buffer, std::size_t size, std::string& error) {
  while (pendingCount_ == 0) {
    if (!WaitReadable(fd_)) return 0;
    const ssize_t received = recv(fd_, datagram_.data(), datagram_.size(), 0);
    if (received < 0) {
      if (errno == EINTR || errno == EAGAIN) continue;
      error = std::string("udp: ") + std::strerror(errno);
      return -1;
    }
    ++datagrams_;
    if (!TsBytesOfDatagram(datagram_.data(), static_cast<std::size_t>(received), pendingAt_, pendingCount_)) {
      ++ignoredDatagrams_;
    }
  }
  const std::size_t given = std::min(size, pendingCount_);
  std::memcpy(buffer, datagram_.data() + pendingAt_, given);
  pendingAt_ += given;
  pendingCount_ -= given;
  return static_cast<long long>(given);
}

}  // namespace ravel_dump

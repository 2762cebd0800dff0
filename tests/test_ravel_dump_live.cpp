// ravel-dump following live inputs, as a process: UDP feeds (unicast,
// multicast, bare or RTP) sent over the loopback interface, pipes and FIFOs,
// and SIGINT/SIGTERM ending the run the way the end of the input does.
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

#include "StreamBuilder.h"

#if defined(RAVEL_DUMP_PATH) && !defined(RAVEL_DUMP_EMULATOR)

namespace {

using std::chrono::milliseconds;

const size_t kPacketsPerDatagram = 7;  // 1316 bytes, as IPTV sends them
const uint8_t kRtpMp2t = 33;
// Bounds of every wait: the tool is killed outright past them.
const auto kReadyTimeout = std::chrono::seconds(5);
const auto kExitTimeout = std::chrono::seconds(10);

std::string ReadFile(const std::string& path) {
  std::ifstream in(path.c_str(), std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}
Bytes Sample() {
  const std::string text = ReadFile(RAVEL_SAMPLES_DIR "/oneseg-brazil.ts");
  return Bytes(text.begin(), text.end());
}

// A ravel-dump process whose output goes to files; `input` becomes its
// standard input (-1: none).
class Tool {
 public:
  Tool(const std::vector<std::string>& args, int input) {
    char pattern[] = "/tmp/ravel_dump_live_XXXXXX";
    dir_ = mkdtemp(pattern);
    pid_ = fork();
    if (pid_ == 0) {
      if (input >= 0) dup2(input, 0);
      dup2(open((dir_ + "/out").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), 1);
      dup2(open((dir_ + "/err").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), 2);
      std::vector<std::string> words{RAVEL_DUMP_PATH};
      words.insert(words.end(), args.begin(), args.end());
      std::vector<char*> argv;
      for (std::string& w : words) argv.push_back(const_cast<char*>(w.c_str()));
      argv.push_back(nullptr);
      execv(argv[0], argv.data());
      _exit(127);
    }
  }
  ~Tool() {
    if (pid_ > 0) Finish(SIGKILL);
    std::remove((dir_ + "/out").c_str());
    std::remove((dir_ + "/err").c_str());
    rmdir(dir_.c_str());
  }

  // Sends `signal` (0: none) and waits for the exit; the exit status, or -1
  // when the tool did not exit normally in time.
  int Finish(int signal) {
    if (signal != 0) kill(pid_, signal);
    int status = 0;
    const auto deadline = std::chrono::steady_clock::now() + kExitTimeout;
    while (waitpid(pid_, &status, WNOHANG) == 0) {
      if (std::chrono::steady_clock::now() > deadline) {
        kill(pid_, SIGKILL);
        waitpid(pid_, &status, 0);
        pid_ = -1;
        return -1;
      }
      std::this_thread::sleep_for(milliseconds(20));
    }
    pid_ = -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
  }
  std::string Out() const { return ReadFile(dir_ + "/out"); }
  std::string Err() const { return ReadFile(dir_ + "/err"); }

 private:
  std::string dir_;
  pid_t pid_ = -1;
};

// A UDP port of 127.0.0.1 that was free a moment ago.
int FreePort() {
  int fd = socket(AF_INET, SOCK_DGRAM, 0);
  sockaddr_in address{};
  address.sin_family = AF_INET;
  address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
  bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address);
  socklen_t size = sizeof address;
  getsockname(fd, reinterpret_cast<sockaddr*>(&address), &size);
  close(fd);
  return ntohs(address.sin_port);
}

// Whether a UDP socket is bound to `port` on this machine.
bool PortBound(int port) {
  char hex[16];
  std::snprintf(hex, sizeof hex, ":%04X ", port);
  return ReadFile("/proc/net/udp").find(hex) != std::string::npos;
}

enum class Framing { kBare, kRtp, kRtpWithCsrcExtensionPadding };

// The datagrams of `stream`: 7 packets each, behind an RTP header when asked.
std::vector<Bytes> Datagrams(const Bytes& stream, Framing framing) {
  std::vector<Bytes> datagrams;
  uint16_t sequence = 0;
  for (size_t at = 0; at < stream.size(); at += kPacketsPerDatagram * 188) {
    size_t end = std::min(stream.size(), at + kPacketsPerDatagram * 188);
    Bytes payload(stream.begin() + at, stream.begin() + end);
    Bytes datagram;
    if (framing == Framing::kRtp) {
      datagram = sb::Cat({sb::U8(0x80), sb::U8(kRtpMp2t), sb::U16(sequence++), sb::U32(0), sb::U32(0x1234)});
    } else if (framing == Framing::kRtpWithCsrcExtensionPadding) {
      // Two CSRCs, an extension of one word, three bytes of padding.
      datagram = sb::Cat({sb::U8(0xB2), sb::U8(kRtpMp2t), sb::U16(sequence++), sb::U32(0), sb::U32(0x1234),
                          sb::U32(1), sb::U32(2), sb::U16(0xABAC), sb::U16(1), sb::U32(0)});
      payload = sb::Cat({payload, Bytes{0, 0, 3}});
    }
    sb::Append(datagram, payload);
    datagrams.push_back(datagram);
  }
  return datagrams;
}

void Send(const std::string& address, int port, const std::vector<Bytes>& datagrams, int rounds) {
  int fd = socket(AF_INET, SOCK_DGRAM, 0);
  in_addr loopback;
  inet_pton(AF_INET, "127.0.0.1", &loopback);
  // Multicast stays on the loopback interface and on this machine.
  setsockopt(fd, IPPROTO_IP, IP_MULTICAST_IF, &loopback, sizeof loopback);
  const unsigned char ttl = 0;
  setsockopt(fd, IPPROTO_IP, IP_MULTICAST_TTL, &ttl, sizeof ttl);
  sockaddr_in target{};
  target.sin_family = AF_INET;
  target.sin_port = htons(port);
  inet_pton(AF_INET, address.c_str(), &target.sin_addr);
  for (int r = 0; r < rounds; ++r) {
    for (const Bytes& d : datagrams) {
      sendto(fd, d.data(), d.size(), 0, reinterpret_cast<sockaddr*>(&target), sizeof target);
    }
    std::this_thread::sleep_for(milliseconds(10));
  }
  close(fd);
}

bool WaitUntilBound(int port) {
  const auto deadline = std::chrono::steady_clock::now() + kReadyTimeout;
  while (!PortBound(port)) {
    if (std::chrono::steady_clock::now() > deadline) return false;
    std::this_thread::sleep_for(milliseconds(10));
  }
  return true;
}

const char kNetworkLine[] = "Network: \"Rede Exemplo\"";

TEST(RavelDumpLive, UdpFeedsAreReadUntilStopped) {
  struct Case {
    const char* name;
    const char* url;         // %d: the port
    const char* sendTo;
    Framing framing;
  } cases[] = {
      {.name = "unicast, bare packets", .url = "udp://127.0.0.1:%d", .sendTo = "127.0.0.1",
       .framing = Framing::kBare},
      {.name = "every local address (VLC), RTP", .url = "udp://@:%d", .sendTo = "127.0.0.1",
       .framing = Framing::kRtp},
      {.name = "unicast, RTP with CSRCs, an extension and padding", .url = "udp://127.0.0.1:%d",
       .sendTo = "127.0.0.1", .framing = Framing::kRtpWithCsrcExtensionPadding},
      {.name = "a sender's address, as ffmpeg reads it: every local address", .url = "udp://192.0.2.1:%d",
       .sendTo = "127.0.0.1", .framing = Framing::kBare},
      {.name = "multicast group joined on the loopback interface", .url = "udp://239.255.42.1:%d?localaddr=127.0.0.1",
       .sendTo = "239.255.42.1", .framing = Framing::kRtp},
  };
  const Bytes sample = Sample();
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    const int port = FreePort();
    char url[128];
    std::snprintf(url, sizeof url, c.url, port);
    Tool tool({"--summary", url}, -1);
    ASSERT_TRUE(WaitUntilBound(port)) << tool.Err();
    Send(c.sendTo, port, Datagrams(sample, c.framing), 3);
    std::this_thread::sleep_for(milliseconds(200));
    EXPECT_EQ(0, tool.Finish(SIGINT));
    EXPECT_NE(std::string::npos, tool.Out().find(kNetworkLine)) << tool.Out();
    // A header left in front of the packets would show as skipped bytes.
    EXPECT_NE(std::string::npos, tool.Err().find("input: 429 packets of 188 bytes, 0 bytes skipped, 0 resyncs"))
        << tool.Err();
  }
}

TEST(RavelDumpLive, BadUdpAddressesFailWithOneLine) {
  struct Case {
    const char* url;
    const char* message;
  } cases[] = {
      {.url = "udp://239.1.1.1", .message = "udp://239.1.1.1: no port"},
      {.url = "udp://@:99999", .message = "bad port '99999'"},
      {.url = "udp://tuner:1234", .message = "'tuner' is not an IPv4 address"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.url);
    Tool tool({c.url}, -1);
    EXPECT_EQ(1, tool.Finish(0));
    EXPECT_NE(std::string::npos, tool.Err().find(c.message)) << tool.Err();
    EXPECT_EQ("", tool.Out());
  }
}

// The writer keeps its end open, as a tuner or a growing recording does: only
// the signal ends the run.
TEST(RavelDumpLive, StopSignalEndsPipesAndFifosAsTheirEnd) {
  struct Case {
    const char* name;
    int signal;
    bool fifo;               // a named FIFO given as the capture, else standard input
    size_t cutPacketBytes;   // bytes of one more packet written before the signal
  } cases[] = {
      {.name = "SIGINT on standard input", .signal = SIGINT, .fifo = false, .cutPacketBytes = 0},
      {.name = "SIGTERM on a FIFO", .signal = SIGTERM, .fifo = true, .cutPacketBytes = 0},
      {.name = "SIGINT inside a packet", .signal = SIGINT, .fifo = false, .cutPacketBytes = 100},
  };
  const Bytes sample = Sample();
  for (const Case& c : cases) {
    SCOPED_TRACE(c.name);
    char pattern[] = "/tmp/ravel_dump_fifo_XXXXXX";
    const std::string dir = mkdtemp(pattern);
    const std::string fifo = dir + "/dvr0";
    int ends[2] = {-1, -1};
    if (c.fifo) {
      ASSERT_EQ(0, mkfifo(fifo.c_str(), 0600));
    } else {
      ASSERT_EQ(0, pipe(ends));
    }
    {
      Tool tool({"--summary", c.fifo ? fifo : "-"}, ends[0]);
      if (ends[0] >= 0) close(ends[0]);
      const int writer = c.fifo ? open(fifo.c_str(), O_WRONLY) : ends[1];
      Bytes written = sample;
      written.insert(written.end(), sample.begin(), sample.begin() + c.cutPacketBytes);
      ASSERT_EQ(static_cast<ssize_t>(written.size()), write(writer, written.data(), written.size()));
      std::this_thread::sleep_for(milliseconds(300));
      EXPECT_EQ(0, tool.Finish(c.signal));
      close(writer);
      EXPECT_NE(std::string::npos, tool.Out().find(kNetworkLine)) << tool.Out();
      EXPECT_NE(std::string::npos, tool.Err().find("input: 143 packets of 188 bytes")) << tool.Err();
    }
    std::remove(fifo.c_str());
    rmdir(dir.c_str());
  }
}

}  // namespace

#endif

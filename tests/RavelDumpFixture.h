// ravel-dump run as a process, the way its users run it, in a fresh temporary
// directory per test: its exit status, standard output and error.
#ifndef RAVEL_TESTS_RAVELDUMPFIXTURE_H
#define RAVEL_TESTS_RAVELDUMPFIXTURE_H

#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include <nlohmann/json.hpp>

#include "StreamBuilder.h"

#ifdef RAVEL_DUMP_PATH

namespace ravel_dump_test {

namespace fs = std::filesystem;

struct ToolRun {
  int status = -1;  // exit status, or -1 when the tool did not exit normally
  std::string out;
  std::string err;
};

inline std::string ReadFile(const std::string& path) {
  std::ifstream in(path.c_str(), std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

inline void WriteFile(const std::string& path, const Bytes& bytes) {
  std::ofstream out(path.c_str(), std::ios::binary);
  out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

// Packets of `pid` carrying `sections`, `repeat` times over.
inline Bytes Packets(uint16_t pid, const std::vector<Bytes>& sections, int repeat = 1) {
  sb::PacketWriter writer(pid);
  for (int r = 0; r < repeat; ++r)
    for (const Bytes& s : sections) writer.AddSection(s);
  return writer.Stream();
}

// Every member of `expected` is in `actual` with the same value.
inline void ExpectMembers(const nlohmann::json& expected, const nlohmann::json& actual) {
  for (const auto& member : expected.items()) EXPECT_EQ(member.value(), actual[member.key()]) << member.key();
}

inline size_t Lines(const std::string& text) { return std::count(text.begin(), text.end(), '\n'); }

class RavelDumpTest : public ::testing::Test {
 protected:
  void SetUp() override {
    char pattern[] = "/tmp/ravel_dump_test_XXXXXX";
    ASSERT_NE(nullptr, mkdtemp(pattern));
    dir_ = pattern;
  }
  void TearDown() override {
    std::error_code ignored;
    fs::permissions(dir_, fs::perms::owner_all, fs::perm_options::add, ignored);
    fs::remove_all(dir_, ignored);
  }

  std::string Path(const std::string& name) const { return dir_ + "/" + name; }

  std::string Write(const std::string& name, const Bytes& bytes) const {
    WriteFile(Path(name), bytes);
    return Path(name);
  }

  // Runs the tool with `args`; `input` becomes its standard input.
  ToolRun Run(const std::vector<std::string>& args, const Bytes& input = Bytes()) const {
    const std::string in = Path(".stdin");
    WriteFile(in, input);
    const int fd = open(in.c_str(), O_RDONLY);
    const pid_t child = Start(args, fd);
    close(fd);
    return Finish(child, 0);
  }

  // Runs the tool with a terminal as its standard input.
  ToolRun RunAtTerminal(const std::vector<std::string>& args) const {
    int terminal = posix_openpt(O_RDWR | O_NOCTTY);
    if (terminal < 0 || grantpt(terminal) != 0 || unlockpt(terminal) != 0) {
      ADD_FAILURE() << "no pseudo-terminal";
      return ToolRun();
    }
    const int fd = open(ptsname(terminal), O_RDONLY | O_NOCTTY);
    const pid_t child = Start(args, fd);
    if (fd >= 0) close(fd);
    ToolRun run = Finish(child, 0);
    close(terminal);
    return run;
  }

  // Starts the tool with `args`; `input` (a descriptor, -1 for none) becomes its
  // standard input. Its outputs go to files that Finish reads.
  pid_t Start(const std::vector<std::string>& args, int input) const {
    const std::string out = Path(".stdout"), err = Path(".stderr");
    pid_t child = fork();
    if (child == 0) {
      int fdOut = open(out.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
      int fdErr = open(err.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
      if (input >= 0) dup2(input, 0);
      dup2(fdOut, 1);
      dup2(fdErr, 2);
      // A cross build's tool runs through its emulator, named first.
      std::vector<std::string> words;
#ifdef RAVEL_DUMP_EMULATOR
      std::istringstream emulator(RAVEL_DUMP_EMULATOR);
      for (std::string word; emulator >> word;) words.push_back(word);
#endif
      words.push_back(RAVEL_DUMP_PATH);
      words.insert(words.end(), args.begin(), args.end());
      std::vector<char*> argv;
      for (std::string& w : words) argv.push_back(const_cast<char*>(w.c_str()));
      argv.push_back(nullptr);
      execvp(argv[0], argv.data());
      _exit(127);
    }
    return child;
  }

  // Sends `signal` (0: none) and waits for the tool's exit; past the time limit
  // it is killed and counts as not exited normally.
  ToolRun Finish(pid_t child, int signal) const {
    if (signal != 0) kill(child, signal);
    ToolRun run;
    int status = 0;
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(300);
    pid_t done = 0;
    while (child > 0 && (done = waitpid(child, &status, WNOHANG)) == 0) {
      if (std::chrono::steady_clock::now() > deadline) {
        kill(child, SIGKILL);
        waitpid(child, &status, 0);
        break;
      }
      std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    if (done == child && WIFEXITED(status)) run.status = WEXITSTATUS(status);
    run.out = ReadFile(Path(".stdout"));
    run.err = ReadFile(Path(".stderr"));
    return run;
  }

  std::string dir_;
};

}  // namespace ravel_dump_test

#endif  // RAVEL_DUMP_PATH

#endif

// Feeds files to a fuzz target without libFuzzer: each argument is an input file
// or a directory of them. Built for every target as <target>_replay with any
// compiler and no sanitizer of its own, to reproduce a finding in a debugger or
// to run a corpus under valgrind (which sees bytes read before being written).
#include <dirent.h>
#include <sys/stat.h>

#include <cstdint>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

int RunFile(const std::string& path) {
  std::ifstream in(path.c_str(), std::ios::binary);
  if (!in) {
    std::fprintf(stderr, "cannot read %s\n", path.c_str());
    return 1;
  }
  std::vector<uint8_t> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  // Exactly the input's size on the heap, as libFuzzer hands it over.
  uint8_t* copy = new uint8_t[bytes.empty() ? 1 : bytes.size()];
  for (size_t i = 0; i < bytes.size(); ++i) copy[i] = bytes[i];
  LLVMFuzzerTestOneInput(copy, bytes.size());
  delete[] copy;
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  int failures = 0;
  int inputs = 0;
  for (int i = 1; i < argc; ++i) {
    struct stat info;
    if (stat(argv[i], &info) == 0 && S_ISDIR(info.st_mode)) {
      DIR* dir = opendir(argv[i]);
      for (dirent* entry = dir ? readdir(dir) : 0; entry != 0; entry = readdir(dir)) {
        if (entry->d_name[0] == '.') continue;
        failures += RunFile(std::string(argv[i]) + "/" + entry->d_name);
        ++inputs;
      }
      if (dir) closedir(dir);
    } else {
      failures += RunFile(argv[i]);
      ++inputs;
    }
  }
  std::fprintf(stderr, "%d inputs replayed\n", inputs);
  return failures == 0 ? 0 : 1;
}

// ravel-make-sample: writes the sample capture of a Brazilian one-segment
// service (samples/oneseg-brazil.ts) with the project's stream builder. The
// output depends on nothing but this program, so a rerun gives the same bytes.
#include <cstdio>
#include <string>

#include "SampleStream.h"

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: ravel-make-sample OUTPUT.ts\n");
    return 2;
  }
  Bytes capture;
  std::string error;
  if (!sample::BuildOneSegCapture(capture, error)) {
    std::fprintf(stderr, "ravel-make-sample: %s\n", error.c_str());
    return 1;
  }
  std::FILE* file = std::fopen(argv[1], "wb");
  if (file == nullptr) {
    std::perror(argv[1]);
    return 1;
  }
  bool written = std::fwrite(capture.data(), 1, capture.size(), file) == capture.size();
  if (std::fclose(file) != 0 || !written) {
    std::fprintf(stderr, "ravel-make-sample: cannot write %s\n", argv[1]);
    return 1;
  }
  std::printf("%s: %zu packets, %zu bytes\n", argv[1], capture.size() / 188, capture.size());
  return 0;
}

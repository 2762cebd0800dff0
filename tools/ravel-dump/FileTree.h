// Writes a tree of files whose names come from the air under one directory and
// nowhere else: every name is a single component checked beforehand, each step
// down opens the directory it made without following links, and each file is
// written to a temporary name in its own directory and renamed into place.
#ifndef RAVEL_DUMP_FILETREE_H
#define RAVEL_DUMP_FILETREE_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ravel_dump {

// Why a name received for a file or directory cannot be one under the tree
// (empty, "." or "..", a slash or a NUL byte, longer than a file name may be);
// "" when it can.
std::string FileNameProblem(const std::string& name);

class FileTreeWriter {
 public:
  FileTreeWriter() = default;
  ~FileTreeWriter();
  FileTreeWriter(const FileTreeWriter&) = delete;
  FileTreeWriter& operator=(const FileTreeWriter&) = delete;

  // Makes `directory` (with its parents) and holds it open. False with a
  // one-line reason that names the `purpose` of the directory.
  bool Open(const std::string& directory, const char* purpose, std::string& error);
  bool IsOpen() const { return root_ >= 0; }
  const std::string& Root() const { return rootPath_; }

  // The directory at `components` below the root, made where missing.
  bool MakeDirectory(const std::vector<std::string>& components, std::string& error);
  // The file at `components` (its directories made where missing), replaced
  // whole. A reason starts with the path below the root.
  bool WriteFile(const std::vector<std::string>& components, const uint8_t* data, std::size_t size,
                 std::string& error);

 private:
  // A descriptor of the directory `count` components down, or -1 with `error`.
  int OpenDirectory(const std::vector<std::string>& components, std::size_t count, std::string& error);

  int root_ = -1;
  std::string rootPath_;
  unsigned int temporaries_ = 0;
};

}  // namespace ravel_dump

#endif

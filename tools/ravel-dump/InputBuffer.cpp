#include "InputBuffer.h"

#include <cstring>

namespace ravel_dump {

long long InputBuffer::Refill(InputFile& input, std::string& error) {
  if (pos > 0) {
    std::memmove(bytes.data(), bytes.data() + pos, end - pos);
    base += pos;
    end -= pos;
    pos = 0;
  }
  const long long n = input.Read(bytes.data() + end, bytes.size() - end, error);
  if (n > 0) end += static_cast<std::size_t>(n);
  return n;
}

}  // namespace ravel_dump

#include "fileio/byte_stream.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <filesystem>

namespace pc::fileio {

bool ByteStream::open(const std::string& path) {
  file_.reset(std::fopen(path.c_str(), "rb"));
  if (!file_) return false;
  buffer_.reset(new unsigned char[kBufferSize]);
  std::error_code ec;
  const auto bytes = std::filesystem::file_size(path, ec);
  size_ = ec ? -1 : static_cast<std::int64_t>(bytes);
  length_ = cursor_ = 0;
  offset_ = 0;
  failed_ = false;
  return true;
}

bool ByteStream::fill() {
  if (!file_ || failed_) return false;
  length_ = std::fread(buffer_.get(), 1, kBufferSize, file_.get());
  cursor_ = 0;
  if (length_ == 0 && std::ferror(file_.get())) failed_ = true;
  return length_ > 0;
}

std::size_t ByteStream::read(void* out, std::size_t n) {
  auto* dest = static_cast<unsigned char*>(out);
  std::size_t done = 0;
  while (done < n) {
    if (cursor_ == length_ && !fill()) break;
    const std::size_t take = std::min(n - done, length_ - cursor_);
    std::memcpy(dest + done, buffer_.get() + cursor_, take);
    cursor_ += take;
    done += take;
  }
  offset_ += static_cast<std::int64_t>(done);
  return done;
}

bool ByteStream::skip(std::uint64_t n) {
  while (n > 0) {
    if (cursor_ == length_ && !fill()) return false;
    const std::size_t take = static_cast<std::size_t>(std::min<std::uint64_t>(n, length_ - cursor_));
    cursor_ += take;
    offset_ += static_cast<std::int64_t>(take);
    n -= take;
  }
  return true;
}

bool ByteStream::seek(std::int64_t offset) {
  if (!file_ || offset < 0 || (size_ >= 0 && offset > size_)) return false;
  // Inside the buffer: no system call.
  const std::int64_t bufferStart = offset_ - static_cast<std::int64_t>(cursor_);
  if (offset >= bufferStart && offset <= bufferStart + static_cast<std::int64_t>(length_)) {
    cursor_ = static_cast<std::size_t>(offset - bufferStart);
    offset_ = offset;
    return true;
  }
  length_ = cursor_ = 0;
  failed_ = false;
  if (offset <= LONG_MAX) {
    offset_ = offset;
    return std::fseek(file_.get(), static_cast<long>(offset), SEEK_SET) == 0;
  }
  // Beyond the C library's offsets: read forward from the start.
  std::rewind(file_.get());
  offset_ = 0;
  return skip(static_cast<std::uint64_t>(offset));
}

bool ByteStream::atEnd() { return cursor_ == length_ && !fill(); }

}  // namespace pc::fileio

// ByteStream: a file read from start to end through one large buffer, with
// the offset of every byte it hands out, for the readers that must say where
// a damaged file stops making sense.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

namespace pc::fileio {

// Where a file stops making sense: the byte offset, the 1-based number of the
// record that could not be read (0 when the file has no records there), and
// what was expected instead.
struct ReadProblem {
  std::int64_t offset = 0;
  std::int64_t record = 0;
  std::string expected;
};

class ByteStream {
 public:
  static constexpr std::size_t kBufferSize = std::size_t{1} << 20;

  ByteStream() = default;
  ByteStream(const ByteStream&) = delete;
  ByteStream& operator=(const ByteStream&) = delete;

  // False when the file cannot be opened.
  bool open(const std::string& path);
  // Offset of the next byte read.
  std::int64_t offset() const { return offset_; }
  // Size of the file when it was opened, -1 when unknown.
  std::int64_t size() const { return size_; }

  // Copies up to n bytes; returns how many were there (fewer at the end of
  // the file or after a system error).
  std::size_t read(void* out, std::size_t n);
  // Skips n bytes; false when the file ends first.
  bool skip(std::uint64_t n);
  // Moves to an absolute offset inside the file; false outside it.
  bool seek(std::int64_t offset);
  // True when no byte is left.
  bool atEnd();
  // True when the system reported a read error.
  bool failed() const { return failed_; }

 private:
  bool fill();

  struct Closer {
    void operator()(std::FILE* f) const { std::fclose(f); }
  };
  std::unique_ptr<std::FILE, Closer> file_;
  std::unique_ptr<unsigned char[]> buffer_;
  std::size_t length_ = 0;
  std::size_t cursor_ = 0;
  std::int64_t offset_ = 0;
  std::int64_t size_ = -1;
  bool failed_ = false;
};

}  // namespace pc::fileio
